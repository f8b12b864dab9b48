// The committed table against the file that it was made from, where Debian's unicode-data is installed.
#include "ktcheckname/caseFolding.h"

#include <gtest/gtest.h>

#include <fstream>
#include <map>
#include <sstream>
#include <string>
#include <vector>

namespace ktcheckname {
namespace {

using CodePoints = std::vector<std::uint32_t>;

bool isFolded(std::uint32_t c) {
  return (c >= 0x41 && c <= 0x232) || (c >= 0x1E00 && c <= 0x1E9B) || (c >= 0x2160 && c <= 0x216F) ||
         (c >= 0x24B6 && c <= 0x24CF) || (c >= 0xFB00 && c <= 0xFB06) || (c >= 0xFF21 && c <= 0xFF3A);
}

std::map<std::uint32_t, CodePoints> readFoldings(std::istream& file) {
  std::map<std::uint32_t, CodePoints> foldings;
  for (std::string line; std::getline(file, line);) {
    std::istringstream fields(line);
    std::uint32_t from = 0;
    std::string status;
    if (!(fields >> std::hex >> from) || !(fields.ignore() >> status) || (status != "C;" && status != "F;")) continue;
    if (!isFolded(from)) continue;
    for (std::uint32_t to = 0; fields >> to;) foldings[from].push_back(to);
  }
  return foldings;
}

TEST(CaseFolding, EveryCodePointIsAsUnicodeHasIt) {
  std::ifstream file("/usr/share/unicode/CaseFolding.txt");
  if (!file) GTEST_SKIP() << "unicode-data is not installed";
  std::map<std::uint32_t, CodePoints> foldings = readFoldings(file);
  ASSERT_GT(foldings.size(), 300u);
  for (std::uint32_t c = 0; c <= 0x10FFFF; ++c) {
    const auto found = foldings.find(c);
    const FoldedCase folded = foldCase(c);
    ASSERT_EQ(CodePoints(folded.codePoints.begin(), folded.codePoints.begin() + folded.count),
              found != foldings.end() ? found->second : CodePoints{c})
        << std::hex << c;
  }
}

}  // namespace
}  // namespace ktcheckname
