#include "ktcheckname/caseFolding.h"

#include <algorithm>

namespace ktcheckname {
namespace {

struct Folding {
  std::uint16_t codePoint;
  std::uint16_t folded[3];  // zero: none
};

constexpr Folding kFoldings[] = {
#include "ktcheckname/caseFolding.inc"
};
static_assert(std::ranges::is_sorted(kFoldings, {}, &Folding::codePoint));

}  // namespace

FoldedCase foldCase(std::uint32_t codePoint) {
  const Folding* row = std::ranges::lower_bound(kFoldings, codePoint, {}, &Folding::codePoint);
  if (row == std::end(kFoldings) || row->codePoint != codePoint) return {{codePoint}, 1};
  FoldedCase result{};
  for (const std::uint16_t folded : row->folded) {
    if (folded != 0) result.codePoints[result.count++] = folded;
  }
  return result;
}

}  // namespace ktcheckname
