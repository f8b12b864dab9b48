#include "tools/outputs/picture/Lane.h"

#include <algorithm>
#include <cmath>
#include <map>

namespace tools {
namespace {

constexpr double kNarrowest = 3;  // columns; narrower segments are not shown one by one

class LaneBuilder {
 public:
  LaneBuilder(const Recording& recording, std::size_t columns)
      : recording_(recording),
        columns_(columns),
        columnsPerSample_(static_cast<double>(columns) / static_cast<double>(recording.samples.size())) {
    findItems();
  }

  Lane build() {
    const std::size_t count = recording_.segments.size();
    for (std::size_t first = 0; first < count;) {
      std::size_t end = first + 1;
      if (isNarrow(first)) {
        while (end < count && isNarrow(end)) ++end;
      }
      addRun(first, end);
      first = end;
    }
    return std::move(lane_);
  }

 private:
  double firstColumn(std::size_t segment) const {
    return static_cast<double>(recording_.segments[segment].firstSample) * columnsPerSample_;
  }
  double lastColumn(std::size_t segment) const {
    return firstColumn(segment) + static_cast<double>(recording_.segments[segment].sampleCount) * columnsPerSample_;
  }
  bool isNarrow(std::size_t segment) const { return lastColumn(segment) - firstColumn(segment) < kNarrowest; }
  std::uint32_t address(std::size_t segment) const { return recording_.segments[segment].address; }
  std::size_t item(std::size_t segment) const { return itemOfAddress_[address(segment)]; }

  void findItems() {
    itemOfAddress_.resize(recording_.program.size());
    std::map<std::pair<SegmentKind, std::string>, std::size_t> known;
    for (const Segment& segment : recording_.segments) {
      const PlayedInstruction& played = recording_.program[segment.address];
      LaneItem wanted = {played.kind, played.kind == SegmentKind::kWaveform ? played.name : ""};
      if (lane_.items.size() + 1 >= kMaxLaneItems && !known.contains({wanted.kind, wanted.name})) {
        wanted = {SegmentKind::kWaveform, "others"};
      }
      const auto [entry, isNew] = known.try_emplace({wanted.kind, wanted.name}, lane_.items.size());
      if (isNew) lane_.items.push_back(wanted);
      itemOfAddress_[segment.address] = entry->second;
    }
  }

  // A run of narrow segments, or one segment.
  void addRun(std::size_t first, std::size_t end) {
    const bool isOneInstruction =
        std::all_of(recording_.segments.begin() + static_cast<std::ptrdiff_t>(first),
                    recording_.segments.begin() + static_cast<std::ptrdiff_t>(end),
                    [this, first](const Segment& segment) { return segment.address == address(first); });
    const bool isSpeck = lastColumn(end - 1) - firstColumn(first) < 1;
    if (isOneInstruction || isSpeck) {
      lane_.blocks.push_back(
          {firstColumn(first), lastColumn(end - 1), item(first), address(first), isOneInstruction ? end - first : 1});
    } else {
      addMixture(first, end);
    }
  }

  void addMixture(std::size_t first, std::size_t end) {
    LaneMixture mixture;
    mixture.firstColumn = static_cast<std::size_t>(firstColumn(first));
    const std::size_t lastWhole = std::min(columns_, static_cast<std::size_t>(std::ceil(lastColumn(end - 1) - 1e-9)));
    mixture.shares.assign(lastWhole - mixture.firstColumn, std::vector<double>(lane_.items.size()));
    mixture.segmentCount = end - first;
    for (std::size_t segment = first; segment < end; ++segment) addShares(mixture, segment);
    for (std::vector<double>& shares : mixture.shares) normalise(shares);
    lane_.mixtures.push_back(std::move(mixture));
  }

  void addShares(LaneMixture& mixture, std::size_t segment) {
    const double begin = firstColumn(segment) - static_cast<double>(mixture.firstColumn);
    const double end = lastColumn(segment) - static_cast<double>(mixture.firstColumn);
    for (auto column = static_cast<std::size_t>(begin); column < mixture.shares.size(); ++column) {
      const auto left = static_cast<double>(column);
      if (left >= end) break;
      mixture.shares[column][item(segment)] += std::min(end, left + 1) - std::max(begin, left);
    }
  }

  static void normalise(std::vector<double>& shares) {
    double sum = 0;
    for (const double share : shares) sum += share;
    for (double& share : shares) share = sum > 0 ? share / sum : 0;
  }

  const Recording& recording_;
  std::size_t columns_;
  double columnsPerSample_;
  std::vector<std::size_t> itemOfAddress_;
  Lane lane_;
};

}  // namespace

Lane makeLane(const Recording& recording, std::size_t columns) { return LaneBuilder(recording, columns).build(); }

}  // namespace tools
