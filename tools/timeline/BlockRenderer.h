// Hands on what a timeline plays from a sample on, block by block, as a player of a generator would. One thread; the
// timeline and the samples of its waveforms must outlive it.
#pragma once

#include <cstdint>
#include <vector>

#include "tools/recording/Recording.h"
#include "tools/timeline/Renderer.h"
#include "tools/timeline/Timeline.h"

namespace tools {

class BlockRenderer {
 public:
  static constexpr std::uint64_t kMostSamples = 1u << 16;  // of a block

  // Blocks hold the wanted parts alone. `sampleWidthBits`: of the generator, 16 or 32.
  BlockRenderer(const Timeline& timeline, const TimelineWaveforms& waveforms, unsigned sampleWidthBits,
                RecordingParts wanted, std::uint64_t firstSample);

  // The next `count` samples, which there are, from 1 to kMostSamples. Holds until the next call.
  RecordingBlock next(std::uint64_t count);

 private:
  void findEvents(std::uint64_t end);

  const Timeline& timeline_;
  Renderer renderer_;
  RecordingParts wanted_;
  RunCursor cursor_;  // at the run that plays at sample_
  std::uint64_t sample_;
  std::uint64_t begin_;  // of the first block
  SampleBuffer samples_;
  std::vector<MarkerEvent> markers_;
  std::vector<SegmentStart> segments_;
};

}  // namespace tools
