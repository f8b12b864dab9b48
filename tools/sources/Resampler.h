// Another sample rate for a stream of numbers, by libsamplerate's best converter, block by block.
#pragma once

#include <functional>
#include <memory>
#include <vector>

struct SRC_STATE_tag;

namespace tools {

class Resampler {
 public:
  using Sink = std::function<void(double)>;

  // `ratio` is the new rate over the old; canResample(ratio). What comes out is handed to `sink` in order.
  Resampler(double ratio, Sink sink);

  // Numbers of at most 2^128 in magnitude are kept with 24 bits.
  void add(double value);
  // Hands out what is still held back.
  void finish();

 private:
  void convert(bool isEnd);

  std::unique_ptr<SRC_STATE_tag, SRC_STATE_tag* (*)(SRC_STATE_tag*)> state_;
  double ratio_;
  Sink sink_;
  std::vector<float> block_;  // taken and not converted yet
};

// Whether libsamplerate converts by that ratio: 1/256 to 256.
bool canResample(double ratio);

}  // namespace tools
