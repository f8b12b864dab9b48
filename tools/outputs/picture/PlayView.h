// What a picture asks of a play: for each column what it shows, however many samples that are. A recording answers from
// what it gathered as it came (RecordedView.h), and a timeline can compute it.
#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "tools/outputs/picture/Envelope.h"
#include "tools/outputs/picture/Lane.h"
#include "tools/recording/Recording.h"

namespace tools {

// How finely a play is shown: into how many columns each lane parts it.
struct PictureScale {
  std::size_t levelColumns = 1;
  std::size_t laneColumns = 1;
  std::size_t eventColumns = 1;  // of events that come closer, the first is shown
};

struct MarkerPulses {
  std::uint64_t count = 0;             // all of them
  std::vector<std::uint64_t> samples;  // of those that are shown, ascending
};

// Where a sample, which the recording has, lies among so many columns.
inline double placeOf(std::uint64_t sample, const RecordingHeader& header, std::size_t columns) {
  return static_cast<double>(sample - header.firstSample) / static_cast<double>(header.sampleCount) *
         static_cast<double>(columns);
}

class PlayView {
 public:
  virtual ~PlayView() = default;

  virtual const RecordingHeader& header() const = 0;
  virtual const Levels& levels() const = 0;
  virtual const Lane& playing() const = 0;
  // Of one that fires.
  virtual const MarkerPulses& pulses(unsigned marker) const = 0;
};

}  // namespace tools
