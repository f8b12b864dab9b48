// An ordered set of 64-bit keys that stays quick when it is large: the keys lie in sorted runs, so that a search reads
// a few neighbouring cache lines where a tree of nodes would wait for memory at every level. A search is logarithmic;
// a change moves at most the keys of one run and, when a run is added or goes, the list of runs. One thread at a time.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <vector>

namespace ktorba {

class SortedKeys {
 public:
  using Key = std::uint64_t;

  void clear();
  void insert(Key key);  // which is not in the set; for want of memory it throws and the set is as it was
  void erase(Key key);   // which is in the set; takes no memory

  std::optional<Key> atOrAbove(Key key) const;  // the lowest such key
  std::optional<Key> below(Key key) const;      // the highest such key
  std::optional<Key> highest() const;

 private:
  using Run = std::vector<Key>;  // never empty, with the capacity for as many keys as it may ever hold

  std::size_t runOf(Key key) const;
  static Run makeRun();
  void split(std::size_t run);
  // Adds a run in front of the one at `index`. An empty one gets `bound` as its key.
  void addRun(std::size_t index, Key bound, Run keys);

  // Two vectors side by side, since a search for the run reads the bounds alone.
  std::vector<Key> bounds_;  // of each run but the first: its keys are not lower, those of the run before it are
  std::vector<Run> runs_;
};

}  // namespace ktorba
