// Samples as a picture can show them: the least and the greatest of each column where there are more samples than
// columns, else the samples themselves. A value.
#pragma once

#include <cstdint>
#include <vector>

#include "tools/recording/SampleBuffer.h"

namespace tools {

struct EnvelopeColumn {
  std::int32_t least = 0;
  std::int32_t greatest = 0;
};

class Envelope {
 public:
  Envelope(std::uint64_t sampleCount, std::size_t columns);

  // Takes the next samples; all together are as many as were announced.
  void take(const SampleSpan& samples);

  bool isReduced() const { return sampleCount_ > columnCount_; }
  // Where it is reduced. Column c holds the samples from c * count / columns up to the first of the next one, and the
  // last sample before them, so that neighbouring columns always join.
  const std::vector<EnvelopeColumn>& columns() const { return columns_; }
  // Where it is not.
  const std::vector<std::int32_t>& samples() const { return samples_; }

  // Of all samples; zeros when there are none.
  EnvelopeColumn extremes() const { return extremes_; }

 private:
  template <typename Samples>
  void reduce(const Samples& samples);
  std::uint64_t endOf(std::size_t column) const;

  std::uint64_t sampleCount_;
  std::size_t columnCount_;
  std::vector<EnvelopeColumn> columns_;  // those begun
  std::vector<std::int32_t> samples_;
  EnvelopeColumn extremes_;
  std::uint64_t taken_ = 0;
  std::uint64_t columnEnd_ = 0;  // the first sample behind the last column begun
  std::int32_t last_ = 0;        // sample
};

}  // namespace tools
