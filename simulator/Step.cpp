#include "simulator/Step.h"

#include <array>
#include <bit>

#include "ktorba/script/instructionDecoder.h"

namespace simulator {
namespace {

namespace fetch_field = ktorba::fetch_field;
namespace loop_field = ktorba::loop_field;
using ktorba::DecodedInstruction;
using ktorba::LoopKind;
using ktorba::Opcode;

bool hasUnusedBits(const DecodedInstruction& instruction) {
  std::array<std::uint32_t, 4> rest = instruction.words.words;
  rest[ktorba::kOpcodeField.word] &= ~(ktorba::kOpcodeField.mask() << ktorba::kOpcodeField.lowestBit);
  for (const ktorba::InstructionField& field : instruction.format->fields) {
    rest[field.word] &= ~(field.mask() << field.lowestBit);
  }
  return (rest[0] | rest[1] | rest[2] | rest[3]) != 0;
}

std::uint64_t samplesRead(const DecodedInstruction& fetch, const MemoryGeometry& geometry) {
  return fetch[fetch_field::kWordCount] * geometry.samplesPerWord;
}

std::uint64_t samplesSkipped(const DecodedInstruction& fetch) {
  return fetch[fetch_field::kHeadSkip] + fetch[fetch_field::kTailSkip];
}

std::uint64_t samplesEmitted(const DecodedInstruction& fetch, const MemoryGeometry& geometry) {
  return samplesRead(fetch, geometry) - samplesSkipped(fetch);
}

const char* findFetchFlaw(const DecodedInstruction& fetch, const MemoryGeometry& geometry) {
  const bool isEnd = fetch.is(Opcode::kScriptEnd);
  const bool isWait = fetch[fetch_field::kIsWait] != 0;
  const std::uint64_t endWord = fetch[fetch_field::kFirstWord] + fetch[fetch_field::kWordCount];
  if (isEnd && !isWait) return "script end without its wait bit";
  if (isEnd != (fetch[fetch_field::kIsFinal] != 0)) return "final bit of another kind of instruction";
  if (fetch[fetch_field::kTriggerNumber] > ktorba::kHardwareTriggerCount) return "trigger above 8";
  if ((isEnd || !isWait) && fetch[fetch_field::kTriggerNumber] != 0) return "trigger on what is no wait";
  if (!isWait && endWord > geometry.sampleMemoryWords) return "address outside sample memory";
  if (samplesRead(fetch, geometry) <= samplesSkipped(fetch)) return "every sample is skipped";
  if (fetch[fetch_field::kMarkerMask] == 0) return nullptr;
  if (isWait && fetch[fetch_field::kTriggerNumber] != 0) return "marker on a wait for a trigger";
  if (fetch[fetch_field::kMarkerOffset] >= samplesEmitted(fetch, geometry)) return "marker behind the last sample";
  return nullptr;
}

const char* findLoopFlaw(const DecodedInstruction& loop, std::uint32_t address) {
  if (loop[loop_field::kIsUntil] != 0 && loop[loop_field::kIsCounted] != 0) return "loop both counted and until";
  if (loop.is(Opcode::kLoopStart) && loop[loop_field::kBodyAddress] != std::uint64_t{address} + 1) {
    return "body does not follow its loop start";
  }
  return nullptr;
}

const char* findFlaw(const DecodedInstruction& instruction, std::uint32_t address, const MemoryGeometry& geometry) {
  if (instruction.format == nullptr) return "unknown opcode";
  if (hasUnusedBits(instruction)) return "bits set that belong to no field";
  switch (instruction.format->opcode) {
    case Opcode::kFetch:
    case Opcode::kScriptEnd:
      return findFetchFlaw(instruction, geometry);
    case Opcode::kLoopStart:
    case Opcode::kLoopEnd:
      return findLoopFlaw(instruction, address);
    case Opcode::kJump:
      return instruction[ktorba::jump_field::kTargetAddress] < geometry.sequenceWords ? nullptr
                                                                                      : "jump outside sequence memory";
  }
  return nullptr;
}

template <typename Number>
Number field(const DecodedInstruction& instruction, const ktorba::InstructionField& which) {
  return static_cast<Number>(instruction[which]);
}

Step readFetch(const DecodedInstruction& fetch, const MemoryGeometry& geometry) {
  Step step{};
  const bool isWait = fetch[fetch_field::kIsWait] != 0;
  step.kind = fetch.is(Opcode::kScriptEnd) ? StepKind::kScriptEnd : isWait ? StepKind::kWait : StepKind::kFetch;
  step.markerMask = field<std::uint8_t>(fetch, fetch_field::kMarkerMask);
  step.markerCount = static_cast<std::uint8_t>(std::popcount(step.markerMask));
  step.clearFlag = field<std::uint8_t>(fetch, fetch_field::kClearFlag);
  step.trigger = field<std::uint8_t>(fetch, fetch_field::kTriggerNumber);
  step.markerOffset = field<std::uint8_t>(fetch, fetch_field::kMarkerOffset);
  step.firstSample = fetch[fetch_field::kFirstWord] * geometry.samplesPerWord + fetch[fetch_field::kHeadSkip];
  step.sampleCount = samplesEmitted(fetch, geometry);
  return step;
}

Step readLoop(const DecodedInstruction& loop) {
  Step step{};
  const bool isUntil = loop[loop_field::kIsUntil] != 0;
  const bool isCounted = loop[loop_field::kIsCounted] != 0;
  step.kind = loop.is(Opcode::kLoopStart) ? StepKind::kLoopStart : StepKind::kLoopEnd;
  step.loopKind = isUntil ? LoopKind::kUntilTrigger : isCounted ? LoopKind::kCounted : LoopKind::kForever;
  step.clearFlag = field<std::uint8_t>(loop, loop_field::kClearFlag);
  step.trigger = field<std::uint8_t>(loop, loop_field::kTriggerNumber);
  step.target = field<std::uint32_t>(loop, loop_field::kBodyAddress);
  step.iterationCount = field<std::uint32_t>(loop, loop_field::kIterationCount);
  return step;
}

Step readJump(const DecodedInstruction& jump) {
  Step step{};
  step.kind = StepKind::kJump;
  step.target = field<std::uint32_t>(jump, ktorba::jump_field::kTargetAddress);
  return step;
}

}  // namespace

const char* findFlaw(const SequenceInstructionWords& words, std::uint32_t address, const MemoryGeometry& geometry) {
  return findFlaw(ktorba::decodeInstruction(words), address, geometry);
}

Step readStep(const SequenceInstructionWords& words, std::uint32_t address, const MemoryGeometry& geometry) {
  const DecodedInstruction instruction = ktorba::decodeInstruction(words);
  if (findFlaw(instruction, address, geometry) != nullptr) {
    Step step{};
    step.kind = StepKind::kMalformed;
    return step;
  }
  switch (instruction.format->opcode) {
    case Opcode::kFetch:
    case Opcode::kScriptEnd:
      return readFetch(instruction, geometry);
    case Opcode::kLoopStart:
    case Opcode::kLoopEnd:
      return readLoop(instruction);
    case Opcode::kJump:
      break;
  }
  return readJump(instruction);
}

}  // namespace simulator
