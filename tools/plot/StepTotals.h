// How much of each thing a timeline plays up to any sample, by arithmetic: the samples of each group that its steps are
// parted into, and how many fetches and waits begin. Each question takes logarithmic time. Constant once made; any
// thread may read. The timeline must outlive it.
#pragma once

#include <cstdint>
#include <vector>

#include "tools/timeline/Timeline.h"

namespace tools {

class StepTotals {
 public:
  // Both by step: its group, from 0, and whether it is the first instruction of its fetch.
  StepTotals(const Timeline& timeline, const std::vector<std::uint32_t>& groups, const std::vector<bool>& begins);

  std::size_t groupCount() const { return totals_.size() - 1; }
  // The samples of a group before that sample, which is at most the timeline's length.
  std::uint64_t samplesBefore(std::size_t group, std::uint64_t sample) const { return before(group, sample); }
  // The fetches and waits that begin before it. All passes of a wait for a trigger are one.
  std::uint64_t beginsBefore(std::uint64_t sample) const { return before(groupCount(), sample); }

 private:
  // Of one group; the last one counts beginnings.
  struct Total {
    std::vector<std::uint32_t> steps;        // that count,
    std::vector<std::uint64_t> beforeStep;   // and what the steps of the body before each come to
    std::vector<std::uint32_t> blocks;       // that hold such steps,
    std::vector<std::uint32_t> first;        // the index of the first of them in `steps`,
    std::vector<std::uint64_t> perPass;      // what one pass comes to, and
    std::vector<std::uint64_t> beforeBlock;  // what is before the block
    std::vector<std::uint64_t> beforeStretch;
  };

  void add(std::size_t total, std::uint32_t block, std::uint32_t step);
  void closeBlock(std::uint32_t block);
  std::uint64_t weightOf(std::size_t total, std::uint32_t step) const;
  std::uint64_t inBody(std::size_t total, std::size_t entry, std::uint64_t samples) const;
  std::uint64_t beforePosition(std::size_t total, std::uint64_t position) const;
  std::uint64_t inStretch(std::size_t total, const Stretch& stretch, std::uint64_t samples) const;
  std::uint64_t before(std::size_t total, std::uint64_t sample) const;

  const Timeline& timeline_;
  std::vector<Total> totals_;
};

}  // namespace tools
