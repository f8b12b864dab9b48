#include "tools/sources/SampleScaler.h"

#include <algorithm>
#include <cmath>

#include "tools/text/Refusal.h"
#include "tools/text/quantities.h"

namespace tools {

SampleScaler::SampleScaler(const std::string& source, const SourceFormat& format)
    : source_(source),
      maxSamples_(format.maxSamples),
      fullScale_(std::ldexp(1.0, static_cast<int>(format.sampleWidthBits) - 1)),
      waveform_{SampleBuffer(format.sampleWidthBits)} {}

void SampleScaler::addFraction(double fraction) {
  const double code = fraction * fullScale_;
  add(code, code < -fullScale_ || code > fullScale_);
}

void SampleScaler::addCode(double code) {
  const double rounded = std::round(code);
  add(code, rounded < -fullScale_ || rounded > fullScale_ - 1);
}

void SampleScaler::add(double code, bool isClipped) {
  if (!std::isfinite(code)) {
    throw Refusal(source_ + ": sample " + std::to_string(waveform_.samples.size()) + " is not a finite number",
                  "Samples are counted from 0; replace the value by a number.");
  }
  checkFits(source_, waveform_.samples.size() + 1, maxSamples_);
  if (isClipped) ++waveform_.clippedSamples;
  waveform_.samples.push(static_cast<std::int32_t>(std::clamp(std::round(code), -fullScale_, fullScale_ - 1)));
}

LoadedWaveform SampleScaler::finish() {
  if (waveform_.samples.empty()) throw Refusal(source_ + ": holds no samples");
  return std::move(waveform_);
}

void checkFits(const std::string& source, std::uint64_t count, std::uint64_t maxSamples) {
  if (count <= maxSamples) return;
  throw Refusal(source + ": is longer than the generator's memory of " + formatCount(maxSamples) + " samples",
                "Shorten it, or give the generator more memory.", Setting::kMemory);
}

}  // namespace tools
