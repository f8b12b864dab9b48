// A place in a script text.
#pragma once

#include <cstdint>

namespace ktwfmscriptcompiler {

struct SourcePosition {
  std::uint32_t line = 0;            // from 1
  std::uint32_t positionInLine = 0;  // bytes, from 1

  bool operator==(const SourcePosition&) const = default;
};

}  // namespace ktwfmscriptcompiler
