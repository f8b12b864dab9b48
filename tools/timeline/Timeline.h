// What a script plays when, computed: from its instructions, the lengths of its waveforms and the samples at which
// triggers are raised, by the rules of the sequencer and without visiting samples or passes that repeat. Building takes
// time of the order of instructions + raised triggers, a question the logarithm of that.
//
// Samples are counted from 0, the first one that plays. Constant once made; any thread may read.
#pragma once

#include <array>
#include <cstdint>
#include <memory>
#include <optional>
#include <span>
#include <vector>

#include "tools/timeline/Folding.h"
#include "tools/timeline/MarkerIndex.h"
#include "tools/timeline/PlayLength.h"
#include "tools/timeline/StraightPlay.h"

namespace tools {

// The samples of one instruction in one pass; all passes of a wait for a trigger are one run.
struct Run {
  std::uint64_t firstSample = 0;
  std::uint64_t sampleCount = 0;  // kBeyond: it waits for ever
  std::uint32_t step = 0;         // index into StraightPlay::steps()
  std::uint32_t block = 0;        // index into StraightPlay::blocks()
  std::uint64_t pass = 0;         // of its loop, from 0
  std::uint64_t round = 0;        // of an endless script, from 0

  std::uint64_t endSample() const { return extentSum(firstSample, sampleCount); }
  bool operator==(const Run&) const = default;
};

class Timeline {
 public:
  // A trigger raised before generation starts counts as raised at sample 0.
  Timeline(StraightPlay play, std::vector<RaisedTrigger> raised);

  const PlayLength& length() const { return folding_.length; }
  // The samples that there are to ask for: those of an exact length, else kBeyond.
  std::uint64_t sampleCount() const { return length().samples().value_or(kBeyond); }

  const StraightPlay& play() const { return *play_; }
  std::span<const Stretch> stretches() const { return folding_.stretches; }

  // Where a sample, which lies before sampleCount(), lies in the straight play.
  struct Located {
    std::size_t stretch;
    std::uint64_t repeat;    // of its piece, from 0
    std::uint64_t position;  // in the straight play
  };
  Located locate(std::uint64_t sample) const;

  // The run that holds a sample; nothing behind the end.
  std::optional<Run> runAt(std::uint64_t sample) const;
  // The step whose last sample is held as the run begins, or which the run plays; Step::kNone: none has played yet.
  std::uint32_t heldStep(const Run& run) const;

  // The pulses of marker 0 to 7 from `begin` to `end`, end excluded; kBeyond: more than 64 bits count.
  std::uint64_t markerCount(std::uint32_t marker, std::uint64_t begin, std::uint64_t end) const;
  // The sample of the marker's n-th pulse, from 0; nothing when there are fewer.
  std::optional<std::uint64_t> markerPulse(std::uint32_t marker, std::uint64_t n) const;
  bool usesMarker(std::uint32_t marker) const { return markers_->isUsed(marker); }

 private:
  std::uint64_t countMarkers(std::uint32_t marker, std::size_t stretch, std::uint64_t samples) const;
  std::uint64_t markersBefore(std::uint32_t marker, std::uint64_t sample) const;

  std::unique_ptr<const StraightPlay> play_;  // keeps its address as the timeline moves
  Folding folding_;
  std::unique_ptr<const MarkerIndex> markers_;
  // Pulses before each stretch; empty for markers that are not used.
  std::array<std::vector<std::uint64_t>, ktorba::kMarkerCount> markersBefore_;
};

// Walks along the runs of a timeline, which must outlive it. One thread at a time.
class RunCursor {
 public:
  // At the run that holds that sample; at the end where there is none.
  RunCursor(const Timeline& timeline, std::uint64_t sample);

  bool isAtEnd() const { return isAtEnd_; }
  const Run& run() const { return run_; }  // not at the end
  void next() {
    if (run_.step + 1 >= lastStep_) return leaveBody();
    ++run_.step;
    run_.firstSample += run_.sampleCount;
    run_.sampleCount = steps_[run_.step].sampleCount;
  }

 private:
  void enter(std::uint64_t position);
  void beginPass();
  void leaveBody();

  const Timeline* timeline_;
  const Step* steps_;
  std::size_t stretch_ = 0;
  std::uint64_t repeat_ = 0;      // of the stretch's piece
  std::uint64_t pieceEnd_ = 0;    // the sample behind this repeat of it
  std::uint32_t lastStep_ = 0;    // behind the steps that can be walked through without a look at loops and pieces
  std::uint64_t passInPlay_ = 0;  // of the run's loop, in the straight play
  Run run_;
  bool isAtEnd_ = false;
};

}  // namespace tools
