// Least and greatest levels of many things in a row, and those of any stretch of them in logarithmic time. Constant
// once made; any thread may read.
#pragma once

#include <algorithm>
#include <cstdint>
#include <limits>
#include <vector>

namespace tools {

// Levels from low to high, both included; nothing where low is above high.
struct LevelRange {
  std::int32_t low = std::numeric_limits<std::int32_t>::max();
  std::int32_t high = std::numeric_limits<std::int32_t>::min();

  bool isEmpty() const { return low > high; }
  void add(std::int32_t level) { add({level, level}); }
  void add(const LevelRange& other) {
    low = std::min(low, other.low);
    high = std::max(high, other.high);
  }
  bool operator==(const LevelRange&) const = default;
};

class RangeTree {
 public:
  RangeTree() = default;
  explicit RangeTree(std::vector<LevelRange> leaves);

  // Of the leaves from begin to end, end excluded.
  LevelRange over(std::size_t begin, std::size_t end) const;

 private:
  std::size_t leafCount_ = 0;
  std::vector<LevelRange> nodes_;  // node n lies above 2n and 2n + 1; the leaves come last
};

}  // namespace tools
