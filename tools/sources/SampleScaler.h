// Turns numbers into samples of the generator's width: scales, resamples, rounds, clips and counts, and refuses what is
// no number and what does not fit the memory. One thread at a time.
#pragma once

#include <limits>
#include <optional>
#include <string>
#include <vector>

#include "tools/sources/Resampler.h"
#include "tools/sources/Scale.h"
#include "tools/sources/Source.h"

namespace tools {

class SampleScaler {
 public:
  // `source` is named in messages and outlives this object. Throws Refusal for a rate that cannot be resampled from.
  SampleScaler(const std::string& source, const SourceFormat& format, const Scale& scale = {});
  SampleScaler(const SampleScaler&) = delete;
  SampleScaler& operator=(const SampleScaler&) = delete;

  // Takes the next number of the file. 1 itself of full scale, one code too high, does not count as clipped.
  void add(double value);

  // The waveform, with a note on what was taken unless `what` is empty: "WHAT, 1 000 samples, -0.2 to 0.9". Throws
  // Refusal when nothing was added.
  LoadedWaveform finish(const std::string& what = {});

 private:
  void place(double value);
  void push(double value);
  void pushAllNormalised();
  void noteTaken(const std::string& what);
  void noteResampled(std::uint64_t taken);

  const std::string& source_;
  SourceFormat format_;
  Scale scale_;
  double codesPerFullScale_;
  double unit_;  // the number that becomes full scale
  double greatestCode_;
  std::optional<Resampler> resampler_;
  std::vector<double> waiting_;  // to be normalised, once the greatest is known
  std::uint64_t taken_ = 0;
  double least_ = std::numeric_limits<double>::infinity();
  double greatest_ = -std::numeric_limits<double>::infinity();
  LoadedWaveform waveform_;
};

// Throws Refusal when a source of `count` samples is longer than the memory.
void checkFits(const std::string& source, std::uint64_t count, std::uint64_t maxSamples);

}  // namespace tools
