// Places in a script text.
#pragma once

#include <cstdint>

namespace ktwfmscriptcompiler {

struct SourcePosition {
  std::uint32_t line = 0;            // from 1
  std::uint32_t positionInLine = 0;  // bytes, from 1

  bool operator==(const SourcePosition&) const = default;
};

// Where a script, a block or an instruction stands. Passed as one value from the tree through translation to a map, so
// that more can be told of a place by telling it here and where the tree is made.
struct SourcePlace {
  SourcePosition start;  // of its first token

  bool operator==(const SourcePlace&) const = default;
};

}  // namespace ktwfmscriptcompiler
