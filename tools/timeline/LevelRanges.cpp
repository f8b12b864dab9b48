#include "tools/timeline/LevelRanges.h"

#include <algorithm>

namespace tools {

LevelRanges::LevelRanges(const Timeline& timeline, const TimelineWaveforms& waveforms, unsigned sampleWidthBits)
    : timeline_(timeline), renderer_(timeline, waveforms, sampleWidthBits) {
  for (const SampleSpan& waveform : waveforms) waveforms_.emplace_back(waveform);
  const StraightPlay& play = timeline.play();
  std::vector<LevelRange> ranges;
  for (const Step& step : play.steps()) ranges.push_back(overStep(step, 0, step.sampleCount));
  steps_ = RangeTree(std::move(ranges));
  ranges.clear();
  for (const Block& block : play.blocks()) ranges.push_back(steps_.over(block.firstStep, block.endStep));
  blocks_ = RangeTree(std::move(ranges));
  ranges.clear();
  for (const Stretch& stretch : timeline.stretches()) {
    ranges.push_back(overStraight(stretch.start, extentSum(stretch.start, stretch.period)));
  }
  stretches_ = RangeTree(std::move(ranges));
}

LevelRange LevelRanges::over(std::uint64_t begin, std::uint64_t end) const {
  end = std::min(end, timeline_.sampleCount());
  if (begin >= end) return {};
  LevelRange range;
  const Run run = *timeline_.runAt(begin);
  if (timeline_.play().steps()[run.step].kind != StepKind::kWaveform) range.add(renderer_.heldLevel(run));
  const std::size_t first = timeline_.locate(begin).stretch;
  const std::size_t last = timeline_.locate(end - 1).stretch;
  const auto stretches = timeline_.stretches();
  for (const std::size_t index : {first, last}) {
    const std::uint64_t from = std::max(begin, stretches[index].firstSample) - stretches[index].firstSample;
    const std::uint64_t to = std::min(end, stretches[index].endSample()) - stretches[index].firstSample;
    range.add(overStretch(stretches[index], from, to));
  }
  if (first + 1 < last) range.add(stretches_.over(first + 1, last));
  return range;
}

// Samples are counted from the start of the stretch.
LevelRange LevelRanges::overStretch(const Stretch& stretch, std::uint64_t begin, std::uint64_t end) const {
  const std::uint64_t firstRepeat = begin / stretch.period;
  const std::uint64_t lastRepeat = (end - 1) / stretch.period;
  const std::uint64_t inFirst = stretch.start + begin % stretch.period;
  const std::uint64_t inLast = stretch.start + (end - 1) % stretch.period + 1;
  if (firstRepeat == lastRepeat) return overStraight(inFirst, inLast);
  const std::uint64_t pieceEnd = extentSum(stretch.start, stretch.period);
  if (firstRepeat + 1 < lastRepeat) return overStraight(stretch.start, pieceEnd);
  LevelRange range = overStraight(inFirst, pieceEnd);
  range.add(overStraight(stretch.start, inLast));
  return range;
}

LevelRange LevelRanges::overStraight(std::uint64_t begin, std::uint64_t end) const {
  const StraightPlay& play = timeline_.play();
  const std::uint32_t first = play.spotAt(begin).block;
  const std::uint32_t last = play.spotAt(end - 1).block;
  const std::uint64_t start = play.blocks()[first].start;
  if (first == last) return overBlock(first, begin - start, end - start);
  LevelRange range = overBlock(first, begin - start, play.blocks()[first].sampleCount());
  range.add(blocks_.over(first + 1, last));
  range.add(overBlock(last, 0, end - play.blocks()[last].start));
  return range;
}

// Samples are counted from the start of the block.
LevelRange LevelRanges::overBlock(std::uint32_t index, std::uint64_t begin, std::uint64_t end) const {
  const Block& block = timeline_.play().blocks()[index];
  const std::uint64_t firstPass = begin / block.bodySamples;
  const std::uint64_t lastPass = (end - 1) / block.bodySamples;
  const std::uint64_t inFirst = begin % block.bodySamples;
  const std::uint64_t inLast = (end - 1) % block.bodySamples + 1;
  if (firstPass == lastPass) return overBody(block, inFirst, inLast);
  if (firstPass + 1 < lastPass) return blocks_.over(index, index + 1);
  LevelRange range = overBody(block, inFirst, block.bodySamples);
  range.add(overBody(block, 0, inLast));
  return range;
}

// Samples are counted from the start of the body.
LevelRange LevelRanges::overBody(const Block& block, std::uint64_t begin, std::uint64_t end) const {
  const auto& steps = timeline_.play().steps();
  const auto indexAt = [&](std::uint64_t sample) {
    const auto next =
        std::upper_bound(steps.begin() + block.firstStep, steps.begin() + block.endStep, sample,
                         [](std::uint64_t position, const Step& step) { return position < step.startInBody; });
    return static_cast<std::size_t>(next - steps.begin()) - 1;
  };
  const std::size_t first = indexAt(begin);
  const std::size_t last = indexAt(end - 1);
  const std::uint64_t inFirst = begin - steps[first].startInBody;
  const std::uint64_t inLast = end - steps[last].startInBody;
  if (first == last) return overStep(steps[first], inFirst, inLast);
  LevelRange range = overStep(steps[first], inFirst, steps[first].sampleCount);
  range.add(steps_.over(first + 1, last));
  range.add(overStep(steps[last], 0, inLast));
  return range;
}

// Samples are counted from the start of the step. What a wait holds was played before.
LevelRange LevelRanges::overStep(const Step& step, std::uint64_t begin, std::uint64_t end) const {
  if (step.kind != StepKind::kWaveform) return {};
  return waveforms_[step.waveform].over(step.firstInWaveform + begin, step.firstInWaveform + end);
}

}  // namespace tools
