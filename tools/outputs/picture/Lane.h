// The lane that shows what plays when: segments wide enough to be seen become blocks, and runs of narrower ones
// become stretches that show how much of each column every waveform takes.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "tools/recording/Recording.h"

namespace tools {

// A waveform or a kind of wait: what the lane gives one colour and the legend one entry.
struct LaneItem {
  SegmentKind kind = SegmentKind::kWait;
  std::string name;  // of the waveform; empty for waits, which share one entry per kind
};

// More waveforms than these share one item, the last, named "others".
inline constexpr std::size_t kMaxLaneItems = 40;

struct LaneBlock {
  double first = 0;             // columns from the start of the lane
  double last = 0;              // likewise
  std::size_t item = 0;         // index into Lane::items
  std::uint32_t address = 0;    // instruction of the first segment in it
  std::uint64_t playCount = 1;  // above 1: so many segments of this one instruction, too narrow to show apart
};

// A stretch of whole columns in which several items alternate too fast to show.
struct LaneMixture {
  std::size_t firstColumn = 0;
  std::vector<std::vector<double>> shares;  // per column, per item, each column's sum is 1
  std::uint64_t segmentCount = 0;
};

struct Lane {
  std::vector<LaneItem> items;  // in the order of their first play
  std::vector<LaneBlock> blocks;
  std::vector<LaneMixture> mixtures;
};

// `columns` is the width of the lane.
Lane makeLane(const Recording& recording, std::size_t columns);

}  // namespace tools
