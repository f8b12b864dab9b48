// What a picture shows of a window of a timeline, computed: in time of the order of its columns and the instructions,
// however many samples and passes the window has. Constant once made; any thread may read. What it is made from must
// outlive it.
#pragma once

#include <array>
#include <cstdint>
#include <vector>

#include "conventions/conventions.h"
#include "tools/outputs/picture/PlayView.h"
#include "tools/timeline/Renderer.h"
#include "tools/timeline/Timeline.h"

namespace tools {

class TimelineView final : public PlayView {
 public:
  // `header` describes the window, which lies in the timeline.
  TimelineView(const RecordingHeader& header, const Timeline& timeline, const TimelineWaveforms& waveforms,
               const PictureScale& scale);

  const RecordingHeader& header() const override { return header_; }
  const Levels& levels() const override { return levels_; }
  const Lane& playing() const override { return lane_; }
  const MarkerPulses& pulses(unsigned marker) const override { return pulses_[marker]; }

 private:
  const RecordingHeader& header_;
  Levels levels_;
  Lane lane_;
  std::array<MarkerPulses, ktorba::kMarkerCount> pulses_;
};

}  // namespace tools
