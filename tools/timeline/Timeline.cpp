#include "tools/timeline/Timeline.h"

#include <algorithm>
#include <utility>

namespace tools {

using Repeats = Stretch::Repeats;

Timeline::Timeline(StraightPlay play, std::vector<RaisedTrigger> raised)
    : play_(std::make_unique<const StraightPlay>(std::move(play))),
      folding_(fold(*play_, std::move(raised))),
      markers_(std::make_unique<const MarkerIndex>(*play_)) {
  for (std::uint32_t marker = 0; marker < ktorba::kMarkerCount; ++marker) {
    if (!markers_->isUsed(marker)) continue;
    std::uint64_t before = 0;
    for (std::size_t stretch = 0; stretch < folding_.stretches.size(); ++stretch) {
      markersBefore_[marker].push_back(before);
      before = extentSum(before, countMarkers(marker, stretch, folding_.stretches[stretch].sampleCount));
    }
  }
}

Timeline::Located Timeline::locate(std::uint64_t sample) const {
  const auto next = std::ranges::upper_bound(folding_.stretches, sample, {}, &Stretch::firstSample);
  const auto index = static_cast<std::size_t>(next - folding_.stretches.begin()) - 1;
  const Stretch& stretch = folding_.stretches[index];
  const std::uint64_t inside = sample - stretch.firstSample;
  return {index, inside / stretch.period, stretch.start + inside % stretch.period};
}

std::optional<Run> Timeline::runAt(std::uint64_t sample) const {
  const RunCursor cursor(*this, sample);
  return cursor.isAtEnd() ? std::nullopt : std::optional(cursor.run());
}

std::uint32_t Timeline::heldStep(const Run& run) const {
  return play_->heldStep({run.block, run.pass, run.step}, run.round);
}

// ---- Markers ----

// In the first `samples` of the stretch.
std::uint64_t Timeline::countMarkers(std::uint32_t marker, std::size_t stretch, std::uint64_t samples) const {
  const Stretch& its = folding_.stretches[stretch];
  const std::uint64_t before = markers_->countBefore(marker, its.start);
  const auto countTo = [&](std::uint64_t sample) { return markers_->countBefore(marker, sample) - before; };
  const std::uint64_t perPiece = countTo(extentSum(its.start, its.period));
  if (samples == kBeyond) return perPiece == 0 || its.period == kBeyond ? perPiece : kBeyond;
  return extentSum(extentProduct(samples / its.period, perPiece), countTo(its.start + samples % its.period));
}

std::uint64_t Timeline::markersBefore(std::uint32_t marker, std::uint64_t sample) const {
  if (sample == 0 || !markers_->isUsed(marker)) return 0;
  const Located last = locate(std::min(sample, sampleCount()) - 1);
  const std::uint64_t inside = std::min(sample, sampleCount()) - folding_.stretches[last.stretch].firstSample;
  return extentSum(markersBefore_[marker][last.stretch], countMarkers(marker, last.stretch, inside));
}

std::uint64_t Timeline::markerCount(std::uint32_t marker, std::uint64_t begin, std::uint64_t end) const {
  return begin < end ? markersBefore(marker, end) - markersBefore(marker, begin) : 0;
}

std::optional<std::uint64_t> Timeline::markerPulse(std::uint32_t marker, std::uint64_t n) const {
  const auto& before = markersBefore_[marker];
  const auto next = std::ranges::upper_bound(before, n);
  if (next == before.begin()) return std::nullopt;
  const auto index = static_cast<std::size_t>(next - before.begin()) - 1;
  const Stretch& stretch = folding_.stretches[index];
  const std::uint64_t inside = n - before[index];
  if (inside >= countMarkers(marker, index, stretch.sampleCount)) return std::nullopt;
  const std::uint64_t first = markers_->countBefore(marker, stretch.start);
  const std::uint64_t perPiece = markers_->countBefore(marker, extentSum(stretch.start, stretch.period)) - first;
  const std::uint64_t position = markers_->pulse(marker, first + inside % perPiece);
  const std::uint64_t piece = extentSum(stretch.firstSample, extentProduct(inside / perPiece, stretch.period));
  const std::uint64_t sample = extentSum(piece, position - stretch.start);
  return sample == kBeyond ? std::nullopt : std::optional(sample);
}

// ---- Runs ----

RunCursor::RunCursor(const Timeline& timeline, std::uint64_t sample)
    : timeline_(&timeline), steps_(timeline.play().steps().data()), isAtEnd_(sample >= timeline.sampleCount()) {
  if (isAtEnd_) return;
  const Timeline::Located located = timeline.locate(sample);
  stretch_ = located.stretch;
  repeat_ = located.repeat;
  enter(located.position);
}

// The run at that sample of the straight play, in the stretch and the repeat at hand.
void RunCursor::enter(std::uint64_t position) {
  const StraightPlay& play = timeline_->play();
  const Stretch& stretch = timeline_->stretches()[stretch_];
  const Spot spot = play.spotAt(position);
  const Block& block = play.blocks()[spot.block];
  const bool isWait = stretch.repeats == Repeats::kWait;
  const std::uint64_t piece = isWait ? stretch.firstSample : stretch.firstSample + repeat_ * stretch.period;
  pieceEnd_ = isWait ? stretch.endSample() : extentSum(piece, stretch.period);
  passInPlay_ = spot.pass;
  run_ = {.step = spot.step, .block = spot.block};
  run_.firstSample = piece + (play.positionOf(spot) - stretch.start);
  run_.sampleCount = isWait ? stretch.sampleCount : steps_[spot.step].sampleCount;
  run_.round = stretch.round + (stretch.repeats == Repeats::kScript ? repeat_ : 0);
  const bool isUnderWay = !block.isCounted() && block.start <= stretch.start;
  run_.pass = (isUnderWay ? stretch.pass : spot.pass) + (stretch.repeats == Repeats::kLoop ? repeat_ : 0);
  beginPass();
}

// Where the piece, or what samples are numbered by, ends in the pass, each step is looked at: it may be the last one.
void RunCursor::beginPass() {
  const Block& block = timeline_->play().blocks()[run_.block];
  const std::uint64_t passEnd = extentSum(run_.firstSample, block.bodySamples - steps_[run_.step].startInBody);
  const bool isWait = timeline_->stretches()[stretch_].repeats == Repeats::kWait;
  lastStep_ = !isWait && passEnd < kBeyond && passEnd <= pieceEnd_ ? block.endStep : run_.step + 1;
}

// Behind the last step of a pass, or of a piece.
void RunCursor::leaveBody() {
  const StraightPlay& play = timeline_->play();
  const Stretch& stretch = timeline_->stretches()[stretch_];
  const std::uint64_t end = run_.endSample();
  isAtEnd_ = end >= timeline_->sampleCount();
  if (isAtEnd_) return;
  if (end < pieceEnd_) {
    const Spot next = play.after({run_.block, passInPlay_, run_.step});
    run_.pass = next.block == run_.block ? run_.pass + (next.pass - passInPlay_) : next.pass;
    passInPlay_ = next.pass;
    run_.step = next.step;
    run_.block = next.block;
    run_.firstSample = end;
    run_.sampleCount = steps_[next.step].sampleCount;
    return beginPass();
  }
  if (end < stretch.endSample()) {
    ++repeat_;
    return enter(stretch.start);
  }
  ++stretch_;
  repeat_ = 0;
  enter(timeline_->stretches()[stretch_].start);
}

}  // namespace tools
