// Full Unicode case folding of Latin letters. Internal to name comparison: use ktcheckname/compareNames.h.
#pragma once

#include <array>
#include <cstdint>

namespace ktcheckname {

// What one code point folds to.
struct FoldedCase {
  std::array<std::uint32_t, 3> codePoints;
  std::uint8_t count;  // 1 to 3
};

// Folds one code point; letters outside the six ranges of compareNames fold to themselves.
FoldedCase foldCase(std::uint32_t codePoint);

}  // namespace ktcheckname
