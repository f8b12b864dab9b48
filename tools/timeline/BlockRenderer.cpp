#include "tools/timeline/BlockRenderer.h"

#include <algorithm>

namespace tools {

BlockRenderer::BlockRenderer(const Timeline& timeline, const TimelineWaveforms& waveforms, unsigned sampleWidthBits,
                             RecordingParts wanted, std::uint64_t firstSample)
    : timeline_(timeline),
      renderer_(timeline, waveforms, sampleWidthBits),
      wanted_(wanted),
      cursor_(timeline, firstSample),
      sample_(firstSample),
      begin_(firstSample),
      samples_(sampleWidthBits) {
  if (wanted.samples) samples_.resize(kMostSamples);
}

RecordingBlock BlockRenderer::next(std::uint64_t count) {
  const std::uint64_t first = sample_;
  if (wanted_.samples) renderer_.render(first, count, samples_.data(), nullptr);
  if (wanted_.markers || wanted_.segments) findEvents(first + count);
  sample_ += count;
  return {first, wanted_.samples ? samples_.first(count) : SampleSpan(), markers_, segments_};
}

// The run that goes beyond the block stays, since its marker may come there.
void BlockRenderer::findEvents(std::uint64_t end) {
  markers_.clear();
  segments_.clear();
  for (; !cursor_.isAtEnd(); cursor_.next()) {
    const Run& run = cursor_.run();
    const Step& step = timeline_.play().steps()[run.step];
    const bool isFirst = sample_ == begin_ && run.firstSample < begin_;
    if (isFirst || (run.firstSample >= sample_ && run.firstSample < end)) {
      segments_.push_back({std::max(run.firstSample, begin_), step.address});
    }
    const std::uint64_t marker = run.firstSample + step.markerOffset;
    if (step.markerMask != 0 && marker >= sample_ && marker < end) markers_.push_back({marker, step.markerMask});
    if (run.endSample() >= end) break;
  }
}

}  // namespace tools
