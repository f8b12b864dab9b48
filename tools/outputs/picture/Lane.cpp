#include "tools/outputs/picture/Lane.h"

#include <algorithm>
#include <cmath>
#include <numeric>
#include <utility>

namespace tools {
void normalise(LaneMixture& mixture, std::size_t items) {
  for (std::vector<double>& shares : mixture.shares) {
    shares.resize(items);
    const double sum = std::accumulate(shares.begin(), shares.end(), 0.0);
    for (double& share : shares) share = sum > 0 ? share / sum : 0;
  }
}

LaneItem itemOf(const PlayedInstruction& played) {
  return {played.kind, played.kind == SegmentKind::kWaveform ? played.name : ""};
}

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
  LaneItem wanted = tools::itemOf(header_.program[address]);
  if (lane_.items.size() + 1 >= kMaxLaneItems && !knownItems_.contains({wanted.kind, wanted.name})) {
    wanted = kOtherItems;
  }
  const auto [entry, isNew] = knownItems_.try_emplace({wanted.kind, wanted.name}, lane_.items.size());
  if (isNew) lane_.items.push_back(wanted);
  item = entry->second;
  return *item;
}

// A fetch that plays again begins with its first instruction.
bool LaneBuilder::continues(const SegmentStart& segment) const {
  return playing_ && segment.address > address_ &&
         header_.program[segment.address].firstOfFetch == header_.program[address_].firstOfFetch;
}

void LaneBuilder::begin(const SegmentStart& segment) {
  if (!continues(segment)) {
    end(segment.sample);
    playing_ = segment;
  }
  address_ = segment.address;
}

Lane LaneBuilder::finish() {
  end(header_.endSample());
  endRow();
  endRun();
  for (LaneMixture& mixture : lane_.mixtures) normalise(mixture, lane_.items.size());
  return std::move(lane_);
}

void LaneBuilder::end(std::uint64_t sample) {
  if (!playing_) return;
  const double first = columnOf(playing_->sample);
  const double width = static_cast<double>(sample - playing_->sample) * columnsPerSample_;
  const Span segment = {first, first + width, playing_->address};
  itemOf(segment.address);  // in the order of their first play
  if (width < kNarrowestBlock) return addToRow(segment);
  endRow();
  endRun();
  addBlock(segment, 1);
}

void LaneBuilder::addBlock(const Span& span, std::uint64_t playCount) {
  lane_.blocks.push_back({span.first, span.last, itemOf(span.address), span.address, playCount});
}

void LaneBuilder::addToRow(const Span& segment) {
  const auto& program = header_.program;
  const bool isInRow = row_.playCount > 0 && program[segment.address].kind != SegmentKind::kWaitForTrigger &&
                       program[segment.address].firstOfFetch == program[row_.span.address].firstOfFetch;
  if (!isInRow) {
    endRow();
    row_.span = segment;
  }
  row_.span.last = segment.last;
  ++row_.playCount;
}

void LaneBuilder::endRow() {
  const Row row = std::exchange(row_, Row());
  if (row.playCount == 0) return;
  if (row.span.last - row.span.first < kNarrowestBlock) return addToRun(row);
  endRun();
  addBlock(row.span, row.playCount);
}

void LaneBuilder::addToRun(const Row& row) {
  if (run_.segmentCount == 0) {
    run_ = Run();
    run_.span = row.span;
    run_.mixture.firstColumn = static_cast<std::size_t>(row.span.first);
  }
  run_.segmentCount += row.playCount;
  run_.span.last = row.span.last;
  addShares(run_.mixture, row.span, itemOf(row.span.address));
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
  run_.span.last - run_.span.first < 1 ? addBlock(run_.span, 1) : addMixture();
  run_.segmentCount = 0;
}

void LaneBuilder::addMixture() {
  const std::size_t lastWhole = std::min(columns_, static_cast<std::size_t>(std::ceil(run_.span.last - 1e-9)));
  run_.mixture.segmentCount = run_.segmentCount;
  run_.mixture.shares.resize(lastWhole - run_.mixture.firstColumn);
  lane_.mixtures.push_back(std::move(run_.mixture));
}

}  // namespace tools
