#include "tools/sources/SampleScaler.h"

#include <algorithm>
#include <cmath>

#include "tools/text/Refusal.h"
#include "tools/text/quantities.h"

namespace tools {

SampleScaler::SampleScaler(const std::string& source, const SourceFormat& format, const Scale& scale)
    : source_(source),
      format_(format),
      scale_(scale),
      codesPerFullScale_(std::ldexp(1.0, static_cast<int>(format.sampleWidthBits) - 1)),
      unit_(scale.areCodes ? codesPerFullScale_ : scale.fullScale),
      greatestCode_(scale.areCodes ? codesPerFullScale_ - 1 : codesPerFullScale_),
      waveform_{SampleBuffer(format.sampleWidthBits)} {
  waveform_.recordedRateHz = scale.recordedRateHz;
  if (!scale.resample || scale.recordedRateHz == format.sampleRateHz) return;
  const double ratio = format.sampleRateHz / scale.recordedRateHz;
  if (!canResample(ratio)) {
    throw Refusal(source + ": cannot be resampled from " + formatQuantity(scale.recordedRateHz, "S/s") + " to " +
                      formatQuantity(format.sampleRateHz, "S/s"),
                  "The rates may differ by a factor of at most 256.", Setting::kSampleRate);
  }
  resampler_.emplace(ratio, [this](double value) { place(value); });
}

void SampleScaler::add(double value) {
  if (!std::isfinite(value)) {
    throw Refusal(source_ + ": sample " + std::to_string(taken_) + " is not a finite number",
                  "Samples are counted from 0; replace the value by a number.");
  }
  ++taken_;
  least_ = std::min(least_, value);
  greatest_ = std::max(greatest_, value);
  resampler_ ? resampler_->add(value) : place(value);
}

void SampleScaler::place(double value) {
  if (!scale_.normalise) return push(value);
  checkFits(source_, waiting_.size() + 1, format_.maxSamples);
  waiting_.push_back(value);
}

void SampleScaler::push(double value) {
  const double code = (value / unit_ * scale_.gain + scale_.offset) * codesPerFullScale_;
  if (!std::isfinite(code)) throw Refusal(source_ + ": a sample is too great a number once it is scaled");
  checkFits(source_, waveform_.samples.size() + 1, format_.maxSamples);
  const double judged = scale_.areCodes ? std::round(code) : code;
  if (judged < -codesPerFullScale_ || judged > greatestCode_) ++waveform_.clippedSamples;
  waveform_.samples.push(
      static_cast<std::int32_t>(std::clamp(std::round(code), -codesPerFullScale_, codesPerFullScale_ - 1)));
}

void SampleScaler::pushAllNormalised() {
  unit_ = 0;
  for (const double value : waiting_) unit_ = std::max(unit_, std::abs(value));
  if (unit_ == 0 && !waiting_.empty()) {
    throw Refusal(source_ + ": holds nothing but zeros, which cannot be normalised");
  }
  for (const double value : waiting_) push(value);
  waiting_ = {};
}

LoadedWaveform SampleScaler::finish(const std::string& what) {
  if (resampler_) resampler_->finish();
  if (scale_.normalise) pushAllNormalised();
  if (waveform_.samples.empty()) throw Refusal(source_ + ": holds no samples");
  if (!what.empty()) noteTaken(what);
  if (resampler_) noteResampled(taken_);
  return std::move(waveform_);
}

void SampleScaler::noteTaken(const std::string& what) {
  waveform_.notes.push_back(what + ", " + formatCount(taken_) + (taken_ == 1 ? " sample, " : " samples, ") +
                            formatNumber(least_) + " to " + formatNumber(greatest_));
}

void SampleScaler::noteResampled(std::uint64_t taken) {
  waveform_.notes.push_back("resampled from " + formatQuantity(scale_.recordedRateHz, "S/s") + " to " +
                            formatQuantity(format_.sampleRateHz, "S/s") + ": " + formatCount(taken) +
                            " samples became " + formatCount(waveform_.samples.size()));
  waveform_.recordedRateHz = format_.sampleRateHz;
}

void checkFits(const std::string& source, std::uint64_t count, std::uint64_t maxSamples) {
  if (count <= maxSamples) return;
  throw Refusal(source + ": is longer than the generator's memory of " + formatCount(maxSamples) + " samples",
                "Shorten it, or give the generator more memory.", Setting::kMemory);
}

}  // namespace tools
