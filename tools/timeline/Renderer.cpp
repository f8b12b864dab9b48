#include "tools/timeline/Renderer.h"

#include <algorithm>
#include <cstring>

namespace tools {

Renderer::Renderer(const Timeline& timeline, const TimelineWaveforms& waveforms, unsigned sampleWidthBits)
    : timeline_(timeline), bytesPerSample_(sampleWidthBits / 8) {
  for (const SampleSpan& waveform : waveforms) {
    data_.push_back(
        waveform.visit([](const auto& samples) { return reinterpret_cast<const std::byte*>(samples.data()); }));
  }
}

std::uint64_t Renderer::render(std::uint64_t begin, std::uint64_t count, void* samples, std::uint8_t* markers) const {
  auto* next = static_cast<std::byte*>(samples);
  std::uint64_t left = begin < timeline_.sampleCount() ? std::min(count, timeline_.sampleCount() - begin) : 0;
  const std::uint64_t rendered = left;
  if (markers != nullptr) std::memset(markers, 0, rendered);
  std::uint64_t at = begin;
  for (RunCursor cursor(timeline_, begin); left > 0; cursor.next()) {
    const Run& run = cursor.run();
    const Step& step = timeline_.play().steps()[run.step];
    const std::uint64_t part = std::min(left, run.endSample() - at);
    const std::uint64_t marker = run.firstSample + step.markerOffset;
    if (markers != nullptr && step.markerMask != 0 && marker >= at && marker - at < part) {
      markers[marker - begin] = step.markerMask;
    }
    if (next != nullptr) {
      renderRun(run, at, part, next);
      next += part * bytesPerSample_;
    }
    at += part;
    left -= part;
  }
  return rendered;
}

void Renderer::renderRun(const Run& run, std::uint64_t begin, std::uint64_t count, std::byte* samples) const {
  const Step& step = timeline_.play().steps()[run.step];
  if (step.kind == StepKind::kWaveform) {
    const std::uint64_t first = step.firstInWaveform + (begin - run.firstSample);
    std::memcpy(samples, data_[step.waveform] + first * bytesPerSample_, count * bytesPerSample_);
  } else if (bytesPerSample_ == 2) {
    std::fill_n(reinterpret_cast<std::int16_t*>(samples), count, static_cast<std::int16_t>(heldLevel(run)));
  } else {
    std::fill_n(reinterpret_cast<std::int32_t*>(samples), count, heldLevel(run));
  }
}

std::int32_t Renderer::heldLevel(const Run& run) const {
  const std::uint32_t held = timeline_.heldStep(run);
  if (held == Step::kNone) return 0;
  const Step& step = timeline_.play().steps()[held];
  const std::byte* const level = data_[step.waveform] + (step.firstInWaveform + step.sampleCount - 1) * bytesPerSample_;
  if (bytesPerSample_ == 2) return *reinterpret_cast<const std::int16_t*>(level);
  return *reinterpret_cast<const std::int32_t*>(level);
}

}  // namespace tools
