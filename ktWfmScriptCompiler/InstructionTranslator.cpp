#include "ktWfmScriptCompiler/InstructionTranslator.h"

#include <utility>

#include "conventions/conventions.h"
#include "ktWfmScriptCompiler/InstructionContainerTranslator.h"
#include "kterr/Failure.h"

namespace ktwfmscriptcompiler {
namespace {

constexpr char kSource[] = R"(ktWfmScriptCompiler\InstructionTranslator)";

}  // namespace

InstructionTranslator::InstructionTranslator(const ScriptTraits& traits, NestingPoliciesInterface& nesting,
                                             FetchInstructionTranslatorInterface& fetchTranslator,
                                             const InstructionValidatorInterface& validator)
    : traits_(traits), nesting_(nesting), fetchTranslator_(fetchTranslator), validator_(validator) {}

void InstructionTranslator::translateGenerate(const GenerateInstruction& generate, SequenceBlock& block) {
  std::uint32_t startOffset = 0;
  std::uint32_t length = kWholeWaveform;
  if (generate.subset != nullptr) {
    validator_.checkSubsetLength(generate);
    startOffset = generate.subset->startOffset;
    length = generate.subset->length;
  }
  fetchTranslator_.translateFetch(generate, generate.waveformName, false, startOffset, length, 0, pendingClearFlags_,
                                  block);
  pendingClearFlags_ = 0;
}

void InstructionTranslator::translateWaitUntil(const WaitInstruction& wait, SequenceBlock& block) {
  validator_.checkNoMarkersInWaitUntil(wait);
  fetchTranslator_.translateFetch(wait, {}, true, 0, traits_.minWaitLength, toHardwareTrigger(wait.trigger),
                                  pendingClearFlags_, block);
  pendingClearFlags_ = 0;
}

void InstructionTranslator::translateWait(const WaitInstruction& wait, SequenceBlock& block) {
  validator_.checkMinWaitLength(wait);
  validator_.checkWaitLengthAligned(wait);
  fetchTranslator_.translateFetch(wait, {}, true, 0, wait.sampleCount, 0, pendingClearFlags_, block);
  pendingClearFlags_ = 0;
}

void InstructionTranslator::translateClear(const ClearInstruction& clear) {
  for (const std::uint32_t trigger : clear.triggers) {
    pendingClearFlags_ |= ktorba::clearFlagOf(toHardwareTrigger(trigger));
  }
}

void InstructionTranslator::translateRepeat(const RepeatInstruction& repeat,
                                            InstructionContainerTranslatorInterface& body, ScriptSink& script) {
  validator_.checkLoopIterations(repeat);
  nesting_.enterRepeatLoop(repeat);
  const std::uint8_t clearFlagOfLoop = std::exchange(pendingClearFlags_, std::uint8_t{0});
  body.translate(repeat, script);
  nesting_.leaveRepeatLoop();
  validator_.checkClearNotLastInLoop(repeat, pendingClearFlags_);
  script.placeBlock(repeat.place());
  script.lastBlock().clearFlag = clearFlagOfLoop;
  setLoop(repeat, script.lastBlock());
}

void InstructionTranslator::setLoop(const RepeatInstruction& repeat, SequenceBlock& block) const {
  switch (repeat.repeatType) {
    case RepeatType::kCounted:
      block.loopKind = ktorba::LoopKind::kCounted;
      block.iterationCount = repeat.iterationCount;
      return;
    case RepeatType::kForever:
      block.loopKind = ktorba::LoopKind::kForever;
      return;
    case RepeatType::kUntilTrigger:
      block.loopKind = ktorba::LoopKind::kUntilTrigger;
      block.triggerNumber = toHardwareTrigger(repeat.trigger);
      return;
  }
  kterr::Failure(ktmxl::kErrorSoftwareFault).at(kSource).raise();
}

std::uint8_t InstructionTranslator::toHardwareTrigger(std::uint32_t tableNumber) const {
  const std::uint8_t trigger = ktorba::hardwareTriggerOf(tableNumber);
  if (trigger == 0) kterr::Failure(ktmxl::kErrorSoftwareFault).at(kSource).raise();
  return trigger;
}

}  // namespace ktwfmscriptcompiler
