#include "tools/outputs/picture/Lane.h"

#include <algorithm>
#include <cmath>

namespace tools {
namespace {

constexpr double kNarrowest = 3;  // columns; narrower segments are not shown one by one

void normalise(std::vector<double>& shares) {
  double sum = 0;
  for (const double share : shares) sum += share;
  for (double& share : shares) share = sum > 0 ? share / sum : 0;
}

}  // namespace

LaneBuilder::LaneBuilder(const RecordingHeader& header, std::size_t columns)
    : header_(header),
      columns_(columns),
      columnsPerSample_(static_cast<double>(columns) / static_cast<double>(header.sampleCount)),
      itemOfAddress_(header.program.size()) {}

double LaneBuilder::columnOf(std::uint64_t sample) const {
  return static_cast<double>(sample - header_.firstSample) * columnsPerSample_;
}

std::size_t LaneBuilder::itemOf(std::uint32_t address) {
  std::optional<std::size_t>& item = itemOfAddress_[address];
  if (item) return *item;
  const PlayedInstruction& played = header_.program[address];
  LaneItem wanted = {played.kind, played.kind == SegmentKind::kWaveform ? played.name : ""};
  if (lane_.items.size() + 1 >= kMaxLaneItems && !knownItems_.contains({wanted.kind, wanted.name})) {
    wanted = {SegmentKind::kWaveform, "others"};
  }
  const auto [entry, isNew] = knownItems_.try_emplace({wanted.kind, wanted.name}, lane_.items.size());
  if (isNew) lane_.items.push_back(wanted);
  item = entry->second;
  return *item;
}

void LaneBuilder::begin(const SegmentStart& segment) {
  end(segment.sample);
  playing_ = segment;
}

Lane LaneBuilder::finish() {
  end(header_.endSample());
  endRun();
  for (LaneMixture& mixture : lane_.mixtures) {
    for (std::vector<double>& shares : mixture.shares) {
      shares.resize(lane_.items.size());
      normalise(shares);
    }
  }
  return std::move(lane_);
}

void LaneBuilder::end(std::uint64_t sample) {
  if (!playing_) return;
  const double first = columnOf(playing_->sample);
  const double width = static_cast<double>(sample - playing_->sample) * columnsPerSample_;
  const Span segment = {first, first + width, playing_->address};
  const std::size_t item = itemOf(segment.address);
  if (segment.last - segment.first < kNarrowest) return addToRun(segment);
  endRun();
  lane_.blocks.push_back({segment.first, segment.last, item, segment.address, 1});
}

void LaneBuilder::addToRun(const Span& segment) {
  if (run_.segmentCount == 0) {
    run_ = Run();
    run_.span = segment;
    run_.mixture.firstColumn = static_cast<std::size_t>(segment.first);
  }
  ++run_.segmentCount;
  run_.span.last = segment.last;
  if (segment.address != run_.span.address) run_.isOneInstruction = false;
  addShares(run_.mixture, segment, itemOf(segment.address));
}

// What lies beyond the lane's end, by rounding, is nowhere.
void LaneBuilder::addShares(LaneMixture& mixture, const Span& segment, std::size_t item) const {
  const double begin = segment.first - static_cast<double>(mixture.firstColumn);
  const double end = segment.last - static_cast<double>(mixture.firstColumn);
  for (auto column = static_cast<std::size_t>(begin); column < columns_ - mixture.firstColumn; ++column) {
    const auto left = static_cast<double>(column);
    if (left >= end) return;
    if (mixture.shares.size() <= column) mixture.shares.resize(column + 1);
    std::vector<double>& shares = mixture.shares[column];
    if (shares.size() <= item) shares.resize(item + 1);
    shares[item] += std::min(end, left + 1) - std::max(begin, left);
  }
}

void LaneBuilder::endRun() {
  if (run_.segmentCount == 0) return;
  const Span& span = run_.span;
  if (run_.isOneInstruction || span.last - span.first < 1) {
    lane_.blocks.push_back(
        {span.first, span.last, itemOf(span.address), span.address, run_.isOneInstruction ? run_.segmentCount : 1});
  } else {
    addMixture();
  }
  run_.segmentCount = 0;
}

void LaneBuilder::addMixture() {
  const std::size_t lastWhole = std::min(columns_, static_cast<std::size_t>(std::ceil(run_.span.last - 1e-9)));
  run_.mixture.segmentCount = run_.segmentCount;
  run_.mixture.shares.resize(lastWhole - run_.mixture.firstColumn);
  lane_.mixtures.push_back(std::move(run_.mixture));
}

}  // namespace tools
