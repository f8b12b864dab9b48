// The least and greatest level of any part of a waveform, in logarithmic time. The samples must outlive it. Constant
// once made; any thread may read.
#pragma once

#include <cstdint>

#include "tools/recording/SampleBuffer.h"
#include "tools/timeline/RangeTree.h"

namespace tools {

class WaveformSummary {
 public:
  explicit WaveformSummary(const SampleSpan& samples);

  // Of the samples from begin to end, end excluded; both within the waveform.
  LevelRange over(std::uint64_t begin, std::uint64_t end) const;

 private:
  LevelRange scan(std::uint64_t begin, std::uint64_t end) const;

  SampleSpan samples_;
  RangeTree chunks_;  // of kChunkSamples each, the last one shorter
};

}  // namespace tools
