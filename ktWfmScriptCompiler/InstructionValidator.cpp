#include "ktWfmScriptCompiler/InstructionValidator.h"

#include <algorithm>

#include "ktWfmScriptCompiler/ScriptFailure.h"

namespace ktwfmscriptcompiler {
namespace {

constexpr char kSource[] = R"(ktWfmScriptCompiler\InstructionValidator)";

// Lengths and counts are compared as the hardware's signed numbers.
std::int32_t asSigned(std::uint32_t value) { return static_cast<std::int32_t>(value); }

// Out of the way of the checks, which nearly always pass.
template <typename Samples>
[[noreturn]] void raiseMisaligned(const kterr::ErrorConstant& error, SourcePosition place, const char* what,
                                  Samples value, const ScriptTraits& traits, std::uint32_t line = __builtin_LINE()) {
  ScriptFailure(error, kSource, place, line)
      .usage(what, value)
      .usage(kterr::kUsageTypeAlignmentQuantum, traits.alignmentQuantum)
      .raise();
}

bool playsSamples(const Instruction& instruction) {
  switch (instruction.type) {
    case TokenType::kGenerate:
    case TokenType::kRepeat:
      return true;
    case TokenType::kWait:
      return downcast<WaitInstruction>(instruction).waitType == WaitType::kCounted;
    default:
      return false;
  }
}

}  // namespace

InstructionValidator::InstructionValidator(const ScriptTraits& traits) : traits_(traits) {}

void InstructionValidator::checkContainerGeneratesSamples(const InstructionContainer& container,
                                                          const NestingPoliciesInterface& nesting) const {
  if (std::ranges::any_of(container.instructions, playsSamples)) return;
  const SourcePosition place{nesting.getLineNumber(), nesting.getPositionInLine()};
  ScriptFailure(ktwfmscriptcompiler_errors::kErrorLoopOrProcedureWithNoSamplesGenerated, kSource, place).raise();
}

void InstructionValidator::checkSubsetLength(const GenerateInstruction& generate) const {
  if (generate.subset == nullptr || asSigned(generate.subset->length) >= 1) return;
  ScriptFailure(ktwfmscriptcompiler_errors::kErrorInvalidSubsetLengthInScript, kSource, generate.position()).raise();
}

void InstructionValidator::checkNoMarkersInWaitUntil(const WaitInstruction& wait) const {
  if (wait.markers.empty()) return;
  ScriptFailure(ktwfmscriptcompiler_errors::kErrorMarkerNotSupportedInWait, kSource, wait.position()).raise();
}

void InstructionValidator::checkClearNotLastInLoop(const RepeatInstruction& repeat,
                                                   std::uint8_t pendingClearFlags) const {
  if (pendingClearFlags == 0) return;
  const SourcePosition place = repeat.instructions.back().position();
  ScriptFailure(ktwfmscriptcompiler_errors::kErrorClearIsLastInstructionOfLoopInScript, kSource, place).raise();
}

void InstructionValidator::checkLoopIterations(const RepeatInstruction& repeat) const {
  if (repeat.repeatType != RepeatType::kCounted || asSigned(repeat.iterationCount) >= 1) return;
  ScriptFailure(ktwfmscriptcompiler_errors::kErrorInvalidLoopIterationsInScript, kSource, repeat.position()).raise();
}

void InstructionValidator::checkMinWaitLength(const WaitInstruction& wait) const {
  if (wait.sampleCount >= traits_.minWaitLength) return;
  ScriptFailure(ktwfmscriptcompiler_errors::kErrorNumSampsToWaitNotGreaterThanMinWaitLengthInScript, kSource,
                wait.position())
      .usage(kterr::kUsageTypeNumberOfSamplesToWait, wait.sampleCount)
      .usage(kterr::kUsageTypeValMustBeGreaterThanOrEqualTo, traits_.minWaitLength)
      .raise();
}

void InstructionValidator::checkMarkersInsideFetch(const FetchInstruction& fetch, std::uint32_t lengthSamples,
                                                   MarkerList markers) const {
  if (markers.empty() || asSigned(markers.back().position) < asSigned(lengthSamples)) return;
  ScriptFailure(ktwfmscriptcompiler_errors::kErrorMarkerPositionOutsideSubsetInScript, kSource, fetch.position())
      .raise();
}

void InstructionValidator::checkMarkerPositionsAligned(const FetchInstruction& fetch, MarkerList markers) const {
  for (const MarkerRecord& marker : markers) {
    if (isAligned(marker.position)) continue;
    raiseMisaligned(ktwfmscriptcompiler_errors::kErrorMarkerPositionNotMultipleOfQuantum, fetch.position(),
                    kterr::kUsageTypeMarkerPosition, asSigned(marker.position), traits_);
  }
}

void InstructionValidator::checkFetchLengthAligned(const FetchInstruction& fetch, std::uint32_t lengthSamples) const {
  if (asSigned(lengthSamples) < 1 || isAligned(lengthSamples)) return;
  raiseMisaligned(ktwfmscriptcompiler_errors::kErrorSubsetLengthNotMultipleOfQuantum, fetch.position(),
                  kterr::kUsageTypeSubsetLength, asSigned(lengthSamples), traits_);
}

void InstructionValidator::checkStartOffsetAligned(const FetchInstruction& fetch, std::uint32_t offsetSamples) const {
  if (isAligned(offsetSamples)) return;
  raiseMisaligned(ktwfmscriptcompiler_errors::kErrorStartOffsetNotMultipleOfQuantum, fetch.position(),
                  kterr::kUsageTypeSubsetStartOffset, offsetSamples, traits_);
}

void InstructionValidator::checkWaitLengthAligned(const WaitInstruction& wait) const {
  if (isAligned(wait.sampleCount)) return;
  raiseMisaligned(ktwfmscriptcompiler_errors::kErrorNumSamplesToWaitNotMultipleOfQuantum, wait.position(),
                  kterr::kUsageTypeNumberOfSamplesToWait, wait.sampleCount, traits_);
}

bool InstructionValidator::isAligned(std::uint32_t samples) const {
  return traits_.alignmentQuantum == 0 || samples % traits_.alignmentQuantum == 0;
}

}  // namespace ktwfmscriptcompiler
