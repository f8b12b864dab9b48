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

struct Levels {
  bool isReduced = false;
  // Where it is reduced. Column c holds the samples from c * count / columns up to the first of the next one, and the
  // last sample before them, so that neighbouring columns always join.
  std::vector<EnvelopeColumn> columns;
  // Where it is not.
  std::vector<std::int32_t> samples;
  EnvelopeColumn extremes;  // of all samples; zeros when there are none
};

// The first sample behind the column, counted from the start of the first.
std::uint64_t endOfColumn(std::size_t column, std::uint64_t sampleCount, std::size_t columns);

void widen(EnvelopeColumn& column, EnvelopeColumn by);

class Envelope {
 public:
  Envelope(std::uint64_t sampleCount, std::size_t columns);

  // Takes the next samples; all together are as many as were announced.
  void take(const SampleSpan& samples);

  const Levels& levels() const { return levels_; }

 private:
  template <typename Samples>
  void reduce(const Samples& samples);

  std::uint64_t sampleCount_;
  std::size_t columnCount_;
  Levels levels_;
  std::uint64_t taken_ = 0;
  std::uint64_t columnEnd_ = 0;  // the first sample behind the last column begun
  std::int32_t last_ = 0;        // sample
};

}  // namespace tools
