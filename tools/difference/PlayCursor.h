// Walks along a straight play sample by sample or in leaps, and says how far it repeats from where it stands. Loops
// for ever and endless scripts go round and round here; a loop until a trigger is played once, and noted. The straight
// play must outlive it. One thread at a time.
#pragma once

#include <array>
#include <cstdint>

#include "tools/timeline/StraightPlay.h"

namespace tools {

// What a script does with triggers between two samples, in this order.
struct TriggerUse {
  std::uint8_t loopEnded = 0;       // hardware trigger that the loop before it repeats until; 0 none
  std::uint8_t clearedAtEntry = 0;  // mask; of the loop that begins
  std::uint8_t loopBegun = 0;       // hardware trigger that the loop repeats until; 0 none
  std::uint8_t cleared = 0;         // mask
  std::uint8_t awaited = 0;         // hardware trigger that the wait ends on; 0 none

  bool operator==(const TriggerUse&) const = default;
};

class PlayCursor {
 public:
  explicit PlayCursor(const StraightPlay& play) : play_(play) {}

  bool isOver() const { return isOver_; }
  const Step& step() const { return play_.steps()[spot_.step]; }
  std::uint64_t offset() const { return offset_; }  // of the sample in the step
  std::uint64_t left() const { return step().sampleCount - offset_; }
  // The step whose last sample is held; Step::kNone: none.
  std::uint32_t heldStep() const { return play_.heldStep(spot_, round_); }
  // At the first sample of a step; nothing inside.
  TriggerUse triggerUse() const;

  // The next samples repeat each other with that period.
  struct Region {
    enum class Kind : std::uint8_t { kNone, kHeld, kLoop, kScript } kind = Kind::kNone;
    std::uint64_t period = 0;
    std::uint64_t extent = 0;  // samples from here on; kBeyond: no end, or beyond 64 bits
    bool isEndless = false;
  };
  std::array<Region, 3> regions() const;

  void advance(std::uint64_t samples);                  // at most left()
  void leap(Region::Kind kind, std::uint64_t samples);  // at most the extent of the region

 private:
  Region heldRegion() const;
  Region loopRegion() const;
  Region scriptRegion() const;
  bool loops() const { return play_.blockOf(spot_).kind == ktorba::LoopKind::kForever; }
  std::uint64_t inBody() const { return step().startInBody + offset_; }
  std::uint64_t roundSamples() const { return play_.sampleCount() - play_.roundStart(); }
  void beginNextStep();

  const StraightPlay& play_;
  Spot spot_{};
  std::uint64_t round_ = 0;  // of an endless script
  std::uint64_t offset_ = 0;
  bool isOver_ = false;
};

}  // namespace tools
