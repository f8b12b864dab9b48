#include "ktcheckname/compareNames.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace ktcheckname {
namespace {

// -1, 0 or 1. The names have buffers of just their size, so that the address sanitizer sees a read behind them.
int compare(std::string_view a, std::string_view b) {
  const std::vector<char> left(a.begin(), a.end());
  const std::vector<char> right(b.begin(), b.end());
  const int order = compareNames({left.data(), left.size()}, {right.data(), right.size()});
  return (order > 0) - (order < 0);
}

TEST(CompareNames, OrdersWithoutRegardToLatinCase) {
  struct Case {
    const char* a;
    const char* b;
    int order;
  };
  const Case cases[] = {
      {"", "", 0},
      {"Wave", "WAVE", 0},
      {"a", "B", -1},
      {"AZ_az-09_Segment7", "az_AZ-09_sEGMENT7", 0},  // eight bytes at a time
      {"@@@@@@@@", "````````", -1},                   // what stands beside the capitals
      {"[[[[[[[[", "{{{{{{{{", -1},
      {"abcdefgh\u00DC", "ABCDEFGH\u00FC", 0},
      {"Z_", "zA", -1},  // '_' stands below the folded letters
      {"ab", "ABC", -1},
      {"STRASSE", "stra\u00DFe", 0},
      {"stra\u00DF", "STRASSE", -1},  // ends in the middle of b
      {"x\u00DF", "xs", 1},           // b ends in the middle of a folding
      {"o\uFB03ce", "OFFICE", 0},     // one code point folds to three
      {"\uFB03", "\uFB00I", 0},       // buffers refill at different places
      {"\uFF21\u2160", "\uFF41\u2170", 0},
      {"\u0178", "\u00FF", 0},
      {"\u0391", "\u03B1", -1},     // Greek keeps its case
      {"\u00B5", "\u03BC", 0},      // the micro sign is Latin-1
      {"\U0001F600", "\uFFFD", 1},  // by code point
      {"\U0001F600", "\U0001F601", -1},
      // Bytes that are no UTF-8 stand for themselves, also where the end cuts a sequence short.
      {"\x80\xF8\xFF", "\u0080\u00F8\u00FF", 0},
      {"\xC3", "\u00C3", 0},
      {"\xE2\x82", "\u00E2\u0082", 0},
      {"\xF0\x9F\x98", "\u00F0\u009F\u0098", 0},
      {"\xF0\xC3\xBC", "\u00F0\u00FC", 0},
      {"\xC3\x41", "\u00C1", 0},  // the top bits of a continuation byte are dropped
  };
  for (const auto& [a, b, order] : cases) {
    EXPECT_EQ(compare(a, b), order) << a << " against " << b;
    EXPECT_EQ(compare(b, a), -order) << b << " against " << a;
  }
}

}  // namespace
}  // namespace ktcheckname
