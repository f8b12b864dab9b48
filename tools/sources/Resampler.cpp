#include "tools/sources/Resampler.h"

#include <samplerate.h>

#include <array>
#include <new>

namespace tools {
namespace {

constexpr std::size_t kBlockSamples = 4096;

}  // namespace

Resampler::Resampler(double ratio, Sink sink) : state_(nullptr, &src_delete), ratio_(ratio), sink_(std::move(sink)) {
  int error = 0;
  state_.reset(src_new(SRC_SINC_BEST_QUALITY, 1, &error));
  if (!state_) throw std::bad_alloc();
  block_.reserve(kBlockSamples);
}

void Resampler::add(double value) {
  block_.push_back(static_cast<float>(value));
  if (block_.size() == kBlockSamples) convert(false);
}

void Resampler::finish() { convert(true); }

void Resampler::convert(bool isEnd) {
  std::array<float, kBlockSamples> out;
  SRC_DATA data{};
  data.data_in = block_.data();
  data.input_frames = static_cast<long>(block_.size());
  data.data_out = out.data();
  data.output_frames = static_cast<long>(out.size());
  data.src_ratio = ratio_;
  data.end_of_input = isEnd ? 1 : 0;
  do {
    src_process(state_.get(), &data);
    data.data_in += data.input_frames_used;
    data.input_frames -= data.input_frames_used;
    for (long i = 0; i < data.output_frames_gen; ++i) sink_(static_cast<double>(out[static_cast<std::size_t>(i)]));
  } while (data.output_frames_gen > 0 || data.input_frames_used > 0);
  block_.clear();
}

bool canResample(double ratio) { return src_is_valid_ratio(ratio) != 0; }

}  // namespace tools
