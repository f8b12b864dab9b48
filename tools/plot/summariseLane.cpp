#include "tools/plot/summariseLane.h"

#include <algorithm>
#include <cmath>
#include <map>

#include "tools/outputs/picture/PlayView.h"
#include "tools/plot/StepTotals.h"

namespace tools {
namespace {

// The steps as a lane sees them.
struct LaneSteps {
  std::vector<LaneItem> items;
  std::vector<std::uint32_t> itemOf;  // by step
  std::vector<bool> begins;           // by step: whether it is the first instruction of its fetch
};

LaneSteps describeSteps(const RecordingHeader& header, const StraightPlay& play) {
  LaneSteps described;
  std::map<std::pair<SegmentKind, std::string>, std::uint32_t> known;
  for (const Step& step : play.steps()) {
    const PlayedInstruction& played = header.program[step.address];
    LaneItem item = itemOf(played);
    if (described.items.size() + 1 >= kMaxLaneItems && !known.contains({item.kind, item.name})) item = kOtherItems;
    const auto [entry, isNew] =
        known.try_emplace({item.kind, item.name}, static_cast<std::uint32_t>(described.items.size()));
    if (isNew) described.items.push_back(item);
    described.itemOf.push_back(entry->second);
    described.begins.push_back(played.firstOfFetch == step.address);
  }
  return described;
}

// All that plays of one fetch or wait in one pass, or in a row, within the window.
struct Box {
  std::uint64_t begin = 0;
  std::uint64_t end = 0;
  Run run;  // one of it
};

class LaneSummary {
 public:
  LaneSummary(const RecordingHeader& header, const Timeline& timeline, std::size_t columns, const LaneSteps& steps,
              const StepTotals& totals)
      : header_(header), timeline_(timeline), columns_(columns), steps_(steps), totals_(totals) {}

  Lane make() {
    std::uint64_t done = header_.firstSample;
    for (const Box& box : findWideBoxes()) {
      addNarrow(done, box.begin);
      addBlock(box, playsIn(box.begin, box.end));
      done = box.end;
    }
    addNarrow(done, header_.endSample());
    lane_.items = steps_.items;
    dropUnplayedItems();
    return std::move(lane_);
  }

 private:
  // Of a sample in the window, or its end.
  double columnOf(std::uint64_t sample) const { return placeOf(sample, header_, columns_); }
  std::uint64_t startOf(std::size_t column) const {
    return column == 0 ? header_.firstSample
                       : header_.firstSample + endOfColumn(column - 1, header_.sampleCount, columns_);
  }
  std::uint32_t fetchOf(std::uint32_t step) const {
    return header_.program[timeline_.play().steps()[step].address].firstOfFetch;
  }

  // The instructions of one fetch lie side by side in their block.
  Box boxAt(std::uint64_t sample) const {
    const Run run = *timeline_.runAt(sample);
    const auto& steps = timeline_.play().steps();
    const Block& block = timeline_.play().blocks()[run.block];
    Box box = {run.firstSample, run.endSample(), run};
    for (std::uint32_t step = run.step; step > block.firstStep && !steps_.begins[step]; --step) {
      box.begin -= steps[step - 1].sampleCount;
    }
    for (std::uint32_t step = run.step + 1; step < block.endStep && !steps_.begins[step]; ++step) {
      box.end = extentSum(box.end, steps[step].sampleCount);
    }
    return box;
  }

  // Also of boxes that reach beyond the window.
  bool isNarrow(const Box& box) const {
    return placeOf(header_.firstSample + (box.end - box.begin), header_, columns_) < kNarrowestBlock;
  }

  Box withinWindow(Box box) const {
    box.begin = std::max(box.begin, header_.firstSample);
    box.end = std::min(box.end, header_.endSample());
    return box;
  }

  // The row of plays that the box stands in: all passes of a loop that holds nothing else.
  Box rowOf(const Box& box) const {
    const StraightPlay& play = timeline_.play();
    const Block& block = play.blocks()[box.run.block];
    if (fetchOf(block.firstStep) != fetchOf(block.endStep - 1)) return box;
    if (play.steps()[block.firstStep].kind == StepKind::kWaitForTrigger) return box;
    const bool isWholeRound = play.isEndless() && play.blocks().size() == StraightPlay::kFirstOfRound + 1;
    if (isWholeRound && box.run.block == StraightPlay::kFirstOfRound) return {play.roundStart(), kBeyond, box.run};
    Box row = box;
    row.begin -= box.run.pass * block.bodySamples;
    row.end = block.isCounted() ? extentSum(row.begin, block.sampleCount()) : endOfLoop(box);
    return row;
  }

  // Pieces that repeat are stepped over as one.
  std::uint64_t endOfLoop(const Box& box) const {
    std::uint64_t end = box.end;
    for (;;) {
      const auto next = timeline_.runAt(end);
      if (!next || next->block != box.run.block || next->round != box.run.round) return end;
      const Stretch& stretch = timeline_.stretches()[timeline_.locate(end).stretch];
      const bool isRepeated = stretch.repeats == Stretch::Repeats::kLoop;
      end = isRepeated ? stretch.endSample() : extentSum(end, box.end - box.begin);
    }
  }

  // What is that wide lies across the start of a column.
  std::vector<Box> findWideBoxes() const {
    std::vector<Box> boxes;
    for (std::size_t column = 0; column < columns_; ++column) {
      if (!boxes.empty() && startOf(column) < boxes.back().end) continue;
      Box box = boxAt(startOf(column));
      if (isNarrow(box)) box = rowOf(box);
      box = withinWindow(box);
      if (!isNarrow(box)) boxes.push_back(box);
    }
    return boxes;
  }

  std::uint64_t playsIn(std::uint64_t begin, std::uint64_t end) const {
    return 1 + totals_.beginsBefore(end) - totals_.beginsBefore(begin + 1);
  }

  void addBlock(const Box& box, std::uint64_t playCount) {
    const std::uint32_t address = timeline_.play().steps()[box.run.step].address;
    lane_.blocks.push_back({columnOf(box.begin), columnOf(box.end), steps_.itemOf[box.run.step], address, playCount});
  }

  // From one end of a box, or of the window, to another.
  void addNarrow(std::uint64_t begin, std::uint64_t end) {
    if (begin == end) return;
    if (columnOf(end) - columnOf(begin) >= 1) return addMixture(begin, end, playsIn(begin, end));
    addBlock({begin, end, boxAt(begin).run}, 1);
  }

  void addMixture(std::uint64_t begin, std::uint64_t end, std::uint64_t count) {
    LaneMixture mixture;
    mixture.firstColumn = static_cast<std::size_t>(columnOf(begin));
    mixture.segmentCount = count;
    const auto last = std::min(columns_, static_cast<std::size_t>(std::ceil(columnOf(end) - 1e-9)));
    for (std::size_t column = mixture.firstColumn; column < last; ++column) {
      // A sample at least, since columns begin between samples.
      const std::uint64_t from = std::min(std::max(begin, startOf(column)), end - 1);
      mixture.shares.push_back(sharesOf(from, std::max(from + 1, std::min(end, startOf(column + 1)))));
    }
    normalise(mixture, steps_.items.size());
    lane_.mixtures.push_back(std::move(mixture));
  }

  std::vector<double> sharesOf(std::uint64_t begin, std::uint64_t end) const {
    std::vector<double> shares(steps_.items.size());
    for (std::size_t item = 0; item < shares.size(); ++item) {
      const std::uint64_t samples = totals_.samplesBefore(item, end) - totals_.samplesBefore(item, begin);
      shares[item] = static_cast<double>(samples);
    }
    return shares;
  }

  void dropUnplayedItems() {
    std::vector<std::size_t> newIndex;
    std::vector<LaneItem> played;
    for (std::size_t item = 0; item < lane_.items.size(); ++item) {
      newIndex.push_back(played.size());
      const bool isPlayed =
          totals_.samplesBefore(item, header_.endSample()) > totals_.samplesBefore(item, header_.firstSample);
      if (isPlayed) played.push_back(lane_.items[item]);
      for (LaneMixture& mixture : lane_.mixtures) {
        for (std::vector<double>& shares : mixture.shares) {
          if (isPlayed) shares[newIndex.back()] = shares[item];
        }
      }
    }
    lane_.items = std::move(played);
    for (LaneBlock& block : lane_.blocks) block.item = newIndex[block.item];
    for (LaneMixture& mixture : lane_.mixtures) {
      for (std::vector<double>& shares : mixture.shares) shares.resize(lane_.items.size());
    }
  }

  const RecordingHeader& header_;
  const Timeline& timeline_;
  std::size_t columns_;
  const LaneSteps& steps_;
  const StepTotals& totals_;
  Lane lane_;
};

Lane visitLane(const RecordingHeader& header, const Timeline& timeline, std::size_t columns) {
  LaneBuilder builder(header, columns);
  for (RunCursor cursor(timeline, header.firstSample);
       !cursor.isAtEnd() && cursor.run().firstSample < header.endSample(); cursor.next()) {
    builder.begin(
        {std::max(cursor.run().firstSample, header.firstSample), timeline.play().steps()[cursor.run().step].address});
  }
  return builder.finish();
}

bool isFewRuns(const RecordingHeader& header, const Timeline& timeline, std::uint64_t most) {
  RunCursor cursor(timeline, header.firstSample);
  while (most-- > 0) {
    if (cursor.isAtEnd() || cursor.run().firstSample >= header.endSample()) return true;
    cursor.next();
  }
  return false;
}

}  // namespace

Lane summariseLane(const RecordingHeader& header, const Timeline& timeline, std::size_t columns,
                   std::uint64_t mostVisitedRuns) {
  if (isFewRuns(header, timeline, mostVisitedRuns)) return visitLane(header, timeline, columns);
  const LaneSteps steps = describeSteps(header, timeline.play());
  const StepTotals totals(timeline, steps.itemOf, steps.begins);
  return LaneSummary(header, timeline, columns, steps, totals).make();
}

}  // namespace tools
