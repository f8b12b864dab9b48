// What really plays: the straight play with pieces of it repeated while a trigger is missing, a loop has no count or
// the script starts over. It follows the sequencer's rules:
//   - starting generation latches the start trigger; the others are latched once their sample has been reached,
//   - a latch is kept until a step that begins, or a loop that is entered, clears it,
//   - a wait for a trigger, and a loop until one, asks at the end of each of its passes,
//   - at one sample triggers are latched first, questions are answered next, and clears act last.
// All state that a pass hands to the next is the latches, and clearing twice clears no more: a pass that leaves the
// latches as it found them is followed by its equals until the next trigger comes.
#pragma once

#include <cstdint>
#include <vector>

#include "tools/timeline/PlayLength.h"
#include "tools/timeline/StraightPlay.h"

namespace tools {

// A trigger as it is raised from outside.
struct RaisedTrigger {
  std::uint64_t sample = 0;  // it counts for what ends there or later
  std::uint8_t trigger = 0;  // hardware trigger, 1 to 8

  bool operator==(const RaisedTrigger&) const = default;
};

// A piece of the straight play, played once or again and again.
struct Stretch {
  std::uint64_t firstSample = 0;  // of what plays
  std::uint64_t sampleCount = 0;  // kBeyond: it does not end, or beyond 64 bits
  std::uint64_t start = 0;        // of the piece, in the straight play
  std::uint64_t period = 0;       // samples of the piece
  std::uint64_t round = 0;        // of the script, as it begins
  std::uint64_t pass = 0;         // of the loop that it begins in, as it begins; 0 for counted loops
  enum class Repeats : std::uint8_t { kNothing, kWait, kLoop, kScript } repeats = Repeats::kNothing;

  std::uint64_t endSample() const { return extentSum(firstSample, sampleCount); }
};

struct Folding {
  std::vector<Stretch> stretches;  // ascending, without gaps
  PlayLength length = PlayLength::tooLong();
};

// In time of the order of steps + raised triggers * log steps. `raised` in any order.
Folding fold(const StraightPlay& play, std::vector<RaisedTrigger> raised);

}  // namespace tools
