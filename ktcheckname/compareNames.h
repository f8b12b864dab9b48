// Order and equality of names: UTF-8, without regard to letter case. Full Unicode case folding (CaseFolding.txt,
// statuses C and F) in six ranges of Latin letters; other letters keep their case. Any thread may call.
#pragma once

#include <cstdint>
#include <string_view>

namespace ktcheckname {

// Negative when `a` orders before `b`, zero when they are the same name, positive when after. Never fails; bytes that
// are no UTF-8 count as code points of their own value.
int compareNames(std::string_view a, std::string_view b);

// Reads the code point at `position` (below `end`) and moves `position` past it, never past `end`.
std::uint32_t decodeUtf8(const char*& position, const char* end);

// Orders the keys of maps by name.
struct NameLess {
  using is_transparent = void;
  bool operator()(std::string_view a, std::string_view b) const { return compareNames(a, b) < 0; }
};

}  // namespace ktcheckname
