// What a picture shows of a recording, gathered block by block; what it keeps depends on the scale alone. One thread;
// the header must outlive it.
#pragma once

#include <array>

#include "conventions/conventions.h"
#include "tools/outputs/picture/PlayView.h"

namespace tools {

class RecordedView final : public PlayView, public RecordingSink {
 public:
  RecordedView(const RecordingHeader& header, const PictureScale& scale);

  void take(const RecordingBlock& block) override;
  void finish();  // call it once, behind the last block and before anything is asked

  const RecordingHeader& header() const override { return header_; }
  const Levels& levels() const override { return envelope_.levels(); }
  const Lane& playing() const override { return lane_; }
  const MarkerPulses& pulses(unsigned marker) const override { return pulses_[marker]; }

 private:
  void add(const MarkerEvent& event);

  const RecordingHeader& header_;
  PictureScale scale_;
  Envelope envelope_;
  LaneBuilder laneBuilder_;
  Lane lane_;
  std::array<MarkerPulses, ktorba::kMarkerCount> pulses_;
};

}  // namespace tools
