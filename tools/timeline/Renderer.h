// The samples and markers of any window of a timeline, from the samples of its waveforms. Both must outlive it, and
// each waveform has the length that the program was built with. Constant once made; any thread may read.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "tools/recording/SampleBuffer.h"
#include "tools/timeline/Timeline.h"

namespace tools {

// By index into StraightPlay::waveforms(); all of one width.
using TimelineWaveforms = std::vector<SampleSpan>;

class Renderer {
 public:
  // `sampleWidthBits`: of the generator, 16 or 32.
  Renderer(const Timeline& timeline, const TimelineWaveforms& waveforms, unsigned sampleWidthBits);

  // Writes up to `count` samples of that width, and as many marker bytes (bit n: marker n), from sample `begin` on;
  // either goes nowhere where it is null. Returns how many there were before the end.
  std::uint64_t render(std::uint64_t begin, std::uint64_t count, void* samples, std::uint8_t* markers) const;

  // The level that the run holds, of one that plays no waveform.
  std::int32_t heldLevel(const Run& run) const;

 private:
  void renderRun(const Run& run, std::uint64_t begin, std::uint64_t count, std::byte* samples) const;

  const Timeline& timeline_;
  std::vector<const std::byte*> data_;  // of each waveform
  unsigned bytesPerSample_;
};

}  // namespace tools
