#include "tools/plot/StepTotals.h"

#include <algorithm>

namespace tools {

StepTotals::StepTotals(const Timeline& timeline, const std::vector<std::uint32_t>& groups,
                       const std::vector<bool>& begins)
    : timeline_(timeline), totals_(groups.empty() ? 1 : std::ranges::max(groups) + 2) {
  const StraightPlay& play = timeline.play();
  for (std::uint32_t block = 0; block < play.blocks().size(); ++block) {
    for (std::uint32_t step = play.blocks()[block].firstStep; step < play.blocks()[block].endStep; ++step) {
      add(groups[step], block, step);
      if (begins[step]) add(groupCount(), block, step);
    }
    closeBlock(block);
  }
  for (std::size_t total = 0; total < totals_.size(); ++total) {
    std::uint64_t before = 0;
    for (const Stretch& stretch : timeline.stretches()) {
      totals_[total].beforeStretch.push_back(before);
      before = extentSum(before, inStretch(total, stretch, stretch.sampleCount));
    }
  }
}

std::uint64_t StepTotals::weightOf(std::size_t total, std::uint32_t step) const {
  return total == groupCount() ? 1 : timeline_.play().steps()[step].sampleCount;
}

void StepTotals::add(std::size_t index, std::uint32_t block, std::uint32_t step) {
  Total& total = totals_[index];
  if (total.blocks.empty() || total.blocks.back() != block) {
    total.blocks.push_back(block);
    total.first.push_back(static_cast<std::uint32_t>(total.steps.size()));
    total.perPass.push_back(0);
  }
  total.steps.push_back(step);
  total.beforeStep.push_back(total.perPass.back());
  total.perPass.back() = extentSum(total.perPass.back(), weightOf(index, step));
}

void StepTotals::closeBlock(std::uint32_t block) {
  for (Total& total : totals_) {
    if (total.blocks.empty() || total.blocks.back() != block) continue;
    const std::size_t entry = total.blocks.size() - 1;
    std::uint64_t before = 0;
    if (entry > 0) {
      const std::uint64_t lastPasses = timeline_.play().blocks()[total.blocks[entry - 1]].passes;
      before = extentSum(total.beforeBlock.back(), extentProduct(lastPasses, total.perPass[entry - 1]));
    }
    total.beforeBlock.push_back(before);
  }
}

// In the first samples of a pass of the entry's block.
std::uint64_t StepTotals::inBody(std::size_t index, std::size_t entry, std::uint64_t samples) const {
  const Total& total = totals_[index];
  const auto& steps = timeline_.play().steps();
  const auto end = entry + 1 < total.first.size() ? total.first[entry + 1] : total.steps.size();
  const auto first = total.steps.begin() + total.first[entry];
  const auto last = total.steps.begin() + static_cast<std::ptrdiff_t>(end);
  const auto later =
      std::partition_point(first, last, [&](std::uint32_t step) { return steps[step].startInBody < samples; });
  if (later == first) return 0;
  const auto at = static_cast<std::size_t>(later - total.steps.begin()) - 1;
  const std::uint64_t played = samples - steps[total.steps[at]].startInBody;
  return total.beforeStep[at] + std::min(played, weightOf(index, total.steps[at]));
}

// In the straight play.
std::uint64_t StepTotals::beforePosition(std::size_t index, std::uint64_t position) const {
  const Total& total = totals_[index];
  const auto& blocks = timeline_.play().blocks();
  const auto next =
      std::ranges::partition_point(total.blocks, [&](std::uint32_t block) { return blocks[block].start < position; });
  if (next == total.blocks.begin()) return 0;
  const auto entry = static_cast<std::size_t>(next - total.blocks.begin()) - 1;
  const Block& block = blocks[total.blocks[entry]];
  const std::uint64_t inside = position - block.start;
  const std::uint64_t passes = std::min(inside / block.bodySamples, block.passes);
  const std::uint64_t before = extentSum(total.beforeBlock[entry], extentProduct(passes, total.perPass[entry]));
  return passes == block.passes ? before : extentSum(before, inBody(index, entry, inside % block.bodySamples));
}

// In the first samples of the stretch, or all where they are without end.
std::uint64_t StepTotals::inStretch(std::size_t index, const Stretch& stretch, std::uint64_t samples) const {
  const bool isOneWait = stretch.repeats == Stretch::Repeats::kWait && index == groupCount();
  const std::uint64_t first = beforePosition(index, stretch.start);
  const auto upTo = [&](std::uint64_t part) { return beforePosition(index, extentSum(stretch.start, part)) - first; };
  if (isOneWait) return upTo(std::min(samples, stretch.period));
  return extentSum(extentProduct(samples / stretch.period, upTo(stretch.period)), upTo(samples % stretch.period));
}

std::uint64_t StepTotals::before(std::size_t index, std::uint64_t sample) const {
  if (sample == 0) return 0;
  const std::size_t stretch = timeline_.locate(sample - 1).stretch;
  const Stretch& its = timeline_.stretches()[stretch];
  return extentSum(totals_[index].beforeStretch[stretch], inStretch(index, its, sample - its.firstSample));
}

}  // namespace tools
