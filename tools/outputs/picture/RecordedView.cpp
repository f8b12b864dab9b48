#include "tools/outputs/picture/RecordedView.h"

namespace tools {

RecordedView::RecordedView(const RecordingHeader& header, const PictureScale& scale)
    : header_(header),
      scale_(scale),
      envelope_(header.sampleCount, scale.levelColumns),
      laneBuilder_(header, scale.laneColumns) {}

void RecordedView::take(const RecordingBlock& block) {
  envelope_.take(block.samples);
  for (const SegmentStart& segment : block.segments) laneBuilder_.begin(segment);
  for (const MarkerEvent& event : block.markers) add(event);
}

void RecordedView::add(const MarkerEvent& event) {
  for (unsigned marker = 0; marker < ktorba::kMarkerCount; ++marker) {
    if ((event.mask & ktorba::markerBitOf(marker)) == 0) continue;
    MarkerPulses& pulses = pulses_[marker];
    ++pulses.count;
    const auto place = [this](std::uint64_t sample) { return placeOf(sample, header_, scale_.eventColumns); };
    if (pulses.samples.empty() || place(event.sample) >= place(pulses.samples.back()) + 1) {
      pulses.samples.push_back(event.sample);
    }
  }
}

void RecordedView::finish() { lane_ = laneBuilder_.finish(); }

}  // namespace tools
