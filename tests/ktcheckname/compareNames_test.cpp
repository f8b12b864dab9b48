#include "ktcheckname/compareNames.h"

#include <gtest/gtest.h>

#include <string>
#include <tuple>
#include <vector>

namespace ktcheckname {
namespace {

int sign(int value) { return (value > 0) - (value < 0); }

TEST(CompareNames, OrdersWithoutRegardToLatinCase) {
  const std::tuple<const char*, const char*, int> cases[] = {
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
  };
  for (const auto& [a, b, order] : cases) {
    EXPECT_EQ(sign(compareNames(a, b)), order) << a << " against " << b;
    EXPECT_EQ(sign(compareNames(b, a)), -order) << b << " against " << a;
  }
}

std::vector<std::uint32_t> decodeAll(const std::string& text) {
  // A buffer of just the text's size, so that the address sanitizer sees a read behind it.
  const std::vector<char> bytes(text.begin(), text.end());
  std::vector<std::uint32_t> codePoints;
  for (const char *position = bytes.data(), *end = position + bytes.size(); position < end;) {
    codePoints.push_back(decodeUtf8(position, end));
    EXPECT_LE(position, end);
  }
  return codePoints;
}

TEST(DecodeUtf8, TakesWholeSequencesAndSingleBytes) {
  using CodePoints = std::vector<std::uint32_t>;
  const std::pair<const char*, CodePoints> cases[] = {
      {"A\xC3\xBC\xE2\x82\xAC\xF0\x9F\x98\x80", {'A', 0xFC, 0x20AC, 0x1F600}},
      {"\xC3\x41", {0xC1}},  // the top bits of a continuation byte are dropped
      {"\x80\xF8\xFF", {0x80, 0xF8, 0xFF}},
      {"\xC3", {0xC3}},  // cut short by the end: bytes of their own
      {"\xE2\x82", {0xE2, 0x82}},
      {"\xF0\x9F\x98", {0xF0, 0x9F, 0x98}},
      {"\xF0\xC3\xBC", {0xF0, 0xFC}},
  };
  for (const auto& [text, codePoints] : cases) EXPECT_EQ(decodeAll(text), codePoints);
}

}  // namespace
}  // namespace ktcheckname
