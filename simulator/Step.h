// A sequencer instruction made ready to execute: fields read, geometry worked out, checked.
#pragma once

#include <cstdint>

#include "conventions/conventions.h"
#include "ktorba/script/SequenceInstructionWords.h"

namespace simulator {

using nSequenceInstruction::SequenceInstructionWords;

struct MemoryGeometry {
  std::uint32_t bytesPerSample;
  std::uint32_t samplesPerWord;
  std::uint64_t sampleMemoryWords;
  std::uint32_t sequenceWords;
};

enum class StepKind : std::uint8_t { kUnread, kFetch, kWait, kScriptEnd, kLoopStart, kLoopEnd, kJump, kMalformed };

// All zero is kUnread, so that a cache of steps may lie in memory that nobody has written.
struct Step {
  StepKind kind;
  std::uint8_t markerMask;
  ktorba::LoopKind loopKind;     // of a loop's start and end
  std::uint8_t markerCount;      // bits of it
  std::uint8_t markerOffset;     // samples from the first one emitted
  std::uint8_t clearFlag;        // bit h-1: clears hardware trigger h
  std::uint8_t trigger;          // hardware trigger that ends a wait or an until loop, 0 none
  std::uint32_t target;          // address: of a jump, of a loop's body
  std::uint32_t iterationCount;  // passes of a counted loop
  std::uint64_t firstSample;     // from the start of sample memory
  std::uint64_t sampleCount;     // of one pass
};
static_assert(sizeof(Step) == 32, "two to a cache line: the sequencer reads one per instruction");

// What is wrong with an instruction at `address`; null when it is sound.
const char* findFlaw(const SequenceInstructionWords& words, std::uint32_t address, const MemoryGeometry& geometry);

Step readStep(const SequenceInstructionWords& words, std::uint32_t address, const MemoryGeometry& geometry);

}  // namespace simulator
