#include "tools/plot/TimelineView.h"

#include <algorithm>

#include "tools/plot/summariseLane.h"
#include "tools/timeline/LevelRanges.h"

namespace tools {
namespace {

Levels findLevels(const RecordingHeader& header, const Timeline& timeline, const TimelineWaveforms& waveforms,
                  std::size_t columns) {
  Levels levels;
  levels.isReduced = header.sampleCount > columns;
  const LevelRanges ranges(timeline, waveforms, header.sampleWidthBits);
  const LevelRange all = ranges.over(header.firstSample, header.endSample());
  levels.extremes = {all.low, all.high};
  std::uint64_t begin = header.firstSample;
  for (std::size_t column = 0; levels.isReduced && column < columns; ++column) {
    const std::uint64_t end = header.firstSample + endOfColumn(column, header.sampleCount, columns);
    const LevelRange range = ranges.over(column == 0 ? begin : begin - 1, end);
    levels.columns.push_back({range.low, range.high});
    begin = end;
  }
  if (levels.isReduced) return levels;
  SampleBuffer samples(header.sampleWidthBits);
  samples.resize(header.sampleCount);
  Renderer(timeline, waveforms, header.sampleWidthBits)
      .render(header.firstSample, header.sampleCount, samples.data(), nullptr);
  for (std::size_t i = 0; i < samples.size(); ++i) levels.samples.push_back(samples[i]);
  return levels;
}

// From each pulse that is shown the next one is looked for a column further on.
MarkerPulses findPulses(const RecordingHeader& header, const Timeline& timeline, unsigned marker, std::size_t columns) {
  const std::uint64_t first = timeline.markerCount(marker, 0, header.firstSample);
  MarkerPulses pulses;
  pulses.count = timeline.markerCount(marker, header.firstSample, header.endSample());
  const auto place = [&](std::uint64_t sample) { return placeOf(sample, header, columns); };
  const double samplesPerColumn = static_cast<double>(header.sampleCount) / static_cast<double>(columns);
  for (std::uint64_t n = 0; n < pulses.count;) {
    const std::uint64_t sample = *timeline.markerPulse(marker, first + n);
    if (pulses.samples.empty() || place(sample) >= place(pulses.samples.back()) + 1) pulses.samples.push_back(sample);
    // A little short of it, since places are rounded.
    const auto step = static_cast<std::uint64_t>(samplesPerColumn * 0.999);
    const std::uint64_t next = extentSum(pulses.samples.back(), step);
    if (next >= header.endSample()) break;
    n = std::max(n + 1, timeline.markerCount(marker, header.firstSample, next));
  }
  return pulses;
}

}  // namespace

TimelineView::TimelineView(const RecordingHeader& header, const Timeline& timeline, const TimelineWaveforms& waveforms,
                           const PictureScale& scale)
    : header_(header),
      levels_(findLevels(header, timeline, waveforms, scale.levelColumns)),
      lane_(summariseLane(header, timeline, scale.laneColumns)) {
  for (const unsigned marker : usedMarkers(header)) {
    pulses_[marker] = findPulses(header, timeline, marker, scale.eventColumns);
  }
}

}  // namespace tools
