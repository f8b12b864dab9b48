#include "tools/timeline/RangeTree.h"

namespace tools {

RangeTree::RangeTree(std::vector<LevelRange> leaves) : leafCount_(leaves.size()), nodes_(std::move(leaves)) {
  nodes_.insert(nodes_.begin(), leafCount_, LevelRange{});
  for (std::size_t node = leafCount_; node-- > 1;) {
    nodes_[node] = nodes_[2 * node];
    nodes_[node].add(nodes_[2 * node + 1]);
  }
}

LevelRange RangeTree::over(std::size_t begin, std::size_t end) const {
  LevelRange range;
  for (begin += leafCount_, end += leafCount_; begin < end; begin /= 2, end /= 2) {
    if (begin % 2 != 0) range.add(nodes_[begin++]);
    if (end % 2 != 0) range.add(nodes_[--end]);
  }
  return range;
}

}  // namespace tools
