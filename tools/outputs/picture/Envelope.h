// Samples as a picture can show them: the least and the greatest of each column where there are more samples than
// columns.
#pragma once

#include <cstdint>
#include <vector>

#include "tools/recording/SampleBuffer.h"

namespace tools {

struct EnvelopeColumn {
  std::int32_t least = 0;
  std::int32_t greatest = 0;
};

// One entry per column; column c holds the samples from c * size / columns up to the first of the next one, and the
// last sample before them, so that neighbouring columns always join. `columns` is at most samples.size().
std::vector<EnvelopeColumn> makeEnvelope(const SampleBuffer& samples, std::size_t columns);

// The least and greatest of all samples; zeros when there are none.
EnvelopeColumn findExtremes(const SampleBuffer& samples);

}  // namespace tools
