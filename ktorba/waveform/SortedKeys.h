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
  void insert(Key key);  // which is not in the set
  void erase(Key key);   // which is in the set

  std::optional<Key> atOrAbove(Key key) const;  // the lowest such key
  std::optional<Key> below(Key key) const;      // the highest such key
  std::optional<Key> highest() const;

 private:
  using Run = std::vector<Key>;  // never empty

  std::size_t runOf(Key key) const;
  void split(std::size_t run);

  // Two vectors side by side, since a search for the run reads the bounds alone.
  std::vector<Key> bounds_;  // of each run but the first: its keys are not lower, those of the run before it are
  std::vector<Run> runs_;
};

}  // namespace ktorba
