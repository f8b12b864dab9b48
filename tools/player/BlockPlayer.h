// Makes a host play block by block and hands on what comes, so that a play takes no more memory however long it is. One
// thread; the host must outlive it.
#pragma once

#include <cstdint>
#include <vector>

#include "tools/player/Host.h"
#include "tools/recording/Recording.h"

namespace tools {

class BlockPlayer {
 public:
  static constexpr std::uint64_t kMostSamples = 1u << 16;  // of a block

  // Blocks hold the wanted parts alone.
  BlockPlayer(Host& host, unsigned sampleWidthBits, RecordingParts wanted);

  // Plays up to `count` samples and returns how many there were; `take` gets them, unless there were none. Where
  // samples and markers are wanted `count` is at most kMostSamples.
  template <typename Take>
  std::uint64_t play(std::uint64_t firstSample, std::uint64_t count, Take take) {
    const std::uint64_t played = fill(firstSample, count);
    if (played != 0) take(block(firstSample, played));
    return played;
  }

 private:
  std::uint64_t fill(std::uint64_t firstSample, std::uint64_t count);
  void findMarkers(std::uint64_t firstSample, std::uint64_t count);
  RecordingBlock block(std::uint64_t firstSample, std::uint64_t count) const;

  Host& host_;
  RecordingParts wanted_;
  SampleBuffer samples_;
  std::vector<std::uint8_t> markerBits_;
  std::vector<MarkerEvent> markers_;
  std::vector<SegmentStart> segments_;
};

}  // namespace tools
