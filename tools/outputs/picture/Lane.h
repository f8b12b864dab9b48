// The lane that shows what plays when: fetches and waits wide enough to be seen become blocks, and runs of narrower
// ones become stretches that show how much of each column every waveform takes. The instructions that a fetch becomes
// when markers split it are one.
#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <utility>
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
  std::uint64_t playCount = 1;  // above 1: so many plays of this one instruction, too narrow to show apart
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

// Columns. Narrower plays are not shown one by one; plays of one fetch or wait in a row are a block if they are as wide
// together, unless they wait for a trigger, each for its own.
inline constexpr double kNarrowestBlock = 3;

// Makes the shares of each column's items one whole, for that many items.
void normalise(LaneMixture& mixture, std::size_t items);

// What an instruction is in a lane.
LaneItem itemOf(const PlayedInstruction& played);
inline const LaneItem kOtherItems = {SegmentKind::kWaveform, "others"};

// Builds a lane from segments as they begin; what it keeps depends on the lane's width alone. One thread.
class LaneBuilder {
 public:
  // `columns` is the width of the lane; the header must outlive this.
  LaneBuilder(const RecordingHeader& header, std::size_t columns);

  // Instructions of one fetch come one behind the other.
  void begin(const SegmentStart& segment);
  // The segment that began last goes to the end of the recording. Call it once, last.
  Lane finish();

 private:
  struct Span {
    double first = 0;  // columns
    double last = 0;
    std::uint32_t address = 0;
  };
  // Plays of one fetch in a row, each narrow.
  struct Row {
    Span span;
    std::uint64_t playCount = 0;
  };
  // Narrow rows, one behind the other.
  struct Run {
    Span span;
    std::uint64_t segmentCount = 0;
    LaneMixture mixture;
  };

  double columnOf(std::uint64_t sample) const;
  bool continues(const SegmentStart& segment) const;
  std::size_t itemOf(std::uint32_t address);
  void end(std::uint64_t sample);
  void addToRow(const Span& segment);
  void endRow();
  void addToRun(const Row& row);
  void addBlock(const Span& span, std::uint64_t playCount);
  void addShares(LaneMixture& mixture, const Span& segment, std::size_t item) const;
  void endRun();
  void addMixture();

  const RecordingHeader& header_;
  std::size_t columns_;
  double columnsPerSample_;
  std::vector<std::optional<std::size_t>> itemOfAddress_;
  std::map<std::pair<SegmentKind, std::string>, std::size_t> knownItems_;
  std::optional<SegmentStart> playing_;
  std::uint32_t address_ = 0;  // of the segment that began last
  Row row_;
  Run run_;
  Lane lane_;
};

}  // namespace tools
