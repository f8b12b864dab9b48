// Turns numbers into samples of the generator's width: scales, rounds, clips and counts, and refuses what is no number
// and what does not fit the memory.
#pragma once

#include <string>

#include "tools/sources/Source.h"

namespace tools {

class SampleScaler {
 public:
  // `source` is named in messages and outlives this object.
  SampleScaler(const std::string& source, const SourceFormat& format);

  void addFraction(double fraction);  // of full scale; 1 itself, one code too high, does not count as clipped
  void addCode(double code);          // a sample as the generator holds it

  // The waveform. Throws Refusal when nothing was added.
  LoadedWaveform finish();

 private:
  void add(double code, bool isClipped);

  const std::string& source_;
  std::uint64_t maxSamples_;
  double fullScale_;
  LoadedWaveform waveform_;
};

// Throws Refusal when a source of `count` samples is longer than the memory.
void checkFits(const std::string& source, std::uint64_t count, std::uint64_t maxSamples);

}  // namespace tools
