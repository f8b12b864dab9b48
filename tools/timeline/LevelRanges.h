// The least and the greatest level in any window of what plays, exact to the last sample, in logarithmic time (and in
// time of the order of the raised triggers that fall into it). The timeline and the samples of its waveforms must
// outlive it. Constant once made; any thread may read.
#pragma once

#include <cstdint>
#include <vector>

#include "tools/timeline/RangeTree.h"
#include "tools/timeline/Renderer.h"
#include "tools/timeline/Timeline.h"
#include "tools/timeline/WaveformSummary.h"

namespace tools {

class LevelRanges {
 public:
  LevelRanges(const Timeline& timeline, const TimelineWaveforms& waveforms, unsigned sampleWidthBits);

  // From `begin` to `end`, end excluded; empty where nothing plays. A level that is held counts from before the window.
  LevelRange over(std::uint64_t begin, std::uint64_t end) const;

 private:
  LevelRange overStretch(const Stretch& stretch, std::uint64_t begin, std::uint64_t end) const;
  LevelRange overStraight(std::uint64_t begin, std::uint64_t end) const;
  LevelRange overBlock(std::uint32_t block, std::uint64_t begin, std::uint64_t end) const;
  LevelRange overBody(const Block& block, std::uint64_t begin, std::uint64_t end) const;
  LevelRange overStep(const Step& step, std::uint64_t begin, std::uint64_t end) const;

  const Timeline& timeline_;
  Renderer renderer_;
  std::vector<WaveformSummary> waveforms_;
  RangeTree steps_;
  RangeTree blocks_;
  RangeTree stretches_;
};

}  // namespace tools
