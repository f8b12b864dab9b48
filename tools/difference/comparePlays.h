// Whether two programs play the same: sample for sample, marker for marker, and with the same use of triggers, whatever
// triggers come when. How a script is written does not count: a loop of two passes plays as its body written twice.
//
// Equal repeats are not unrolled: two sequences that repeat with periods p and q and agree over p + q samples agree
// for as long as both repeat (Fine and Wilf, "Uniqueness theorems for periodic functions", 1965).
#pragma once

#include <cstdint>
#include <optional>
#include <string>

#include "tools/difference/PlayCursor.h"
#include "tools/timeline/Renderer.h"

namespace tools {

// Must outlive the comparison; the waveforms of both sides are of one width.
struct PlaySide {
  const StraightPlay& play;
  const TimelineWaveforms& waveforms;
};

struct PlayDifference {
  enum class Kind : std::uint8_t { kLevel, kMarkers, kTriggers, kEnd };

  // What one side does there.
  struct Doing {
    std::uint32_t address = 0;  // of the instruction
    std::int32_t level = 0;
    std::uint8_t markers = 0;  // mask
    TriggerUse triggers;
    bool isOver = false;
  };

  Kind kind = Kind::kLevel;
  // From the first one, with each wait for a trigger, and each loop until one, counted once; kBeyond: beyond 64 bits.
  std::uint64_t sample = 0;
  Doing first;
  Doing second;
};

struct PlayComparison {
  std::optional<PlayDifference> difference;  // the first one
  bool isWhole = true;                       // false: the same for 2^64 samples, and what comes then was not compared
};

// In time of the order of instructions and of the samples of waveforms that differ in name or place.
PlayComparison comparePlays(const PlaySide& first, const PlaySide& second);

// "level 100, marker0", "waits until trigger1", "ends": what a side does where the two differ.
std::string describe(const PlayDifference::Doing& doing, PlayDifference::Kind kind);

}  // namespace tools
