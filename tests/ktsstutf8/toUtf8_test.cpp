// The boundary conversion in the encoding that the program runs in: UTF-8, or one of the code pages below. What a
// system does not have is left out; the tests run once in each that they can set.
#include "ktsstutf8/toUtf8.h"

#include <gtest/gtest.h>

#include <map>

#include "platform/system/codePage.h"
#include "testing/caught.h"

namespace {

struct Table {
  std::vector<std::pair<std::string, std::string>> texts;  // as the host has them, and in UTF-8
  std::vector<std::string> invalid;
  std::vector<std::string> missing;  // UTF-8 that the encoding has no characters for, similar ones as it may have
};

std::vector<std::pair<std::string, std::string>> asTheyAre(const std::vector<std::string>& texts) {
  std::vector<std::pair<std::string, std::string>> pairs;
  for (const std::string& text : texts) pairs.emplace_back(text, text);
  return pairs;
}

const std::map<std::string, Table> tables = {
    {"UTF-8",
     {.texts = asTheyAre({"", "wave-1\x01\x7F", "\xC2\x80", "\xDF\xBF", "\xE0\xA0\x80", "\xED\x9F\xBF", "\xEE\x80\x80",
                          "\xEF\xBF\xBF", "\xF0\x90\x80\x80", "\xF4\x8F\xBF\xBF", "a\xC3\xB6z"}),
      .invalid =
          {
              "a\x80", "\xFF", "\xF8\x88\x80\x80\x80",                     // no lead byte
              "a\xE2\x82", "\xC3z",                                        // cut
              "\xC0\x80", "\xC1\xBF", "\xE0\x9F\xBF", "\xF0\x8F\xBF\xBF",  // overlong
              "\xED\xA0\x80", "\xED\xBF\xBF",                              // surrogates
              "\xF4\x90\x80\x80",                                          // above U+10FFFF
          },
      .missing = {}}},
    {"code page 1252",
     {.texts = {{"", ""},
                {"a\x7F", "a\x7F"},
                {"\xFC\x80", "\u00fc\u20ac"},
                {"\xA0\xFF", "\u00a0\u00ff"},
                {"\x9F\x83", "\u0178\u0192"}},
      .invalid = {},
      .missing = {"\u0100", "\u221e", "\u2032", "\u3042", "\U0001F600", "u\u0308"}}},
    {"code page 932",
     {.texts = {{"a\x7F", "a\x7F"},
                {"\xB1", "\uff71"},
                {"\x82\xA0", "\u3042"},
                {"\x8F\xBC\x5C", "\u677e\\"},
                {"\x83\x5C", "\u30bd"}},  // its second byte is a backslash
      .invalid = {"\x82", "a\x81", "\x82\xA0\x82"},
      .missing = {"\u00fc", "\u20ac", "\u00a9", "\U0001F600"}}},
};

const Table& table() {
  const auto found = tables.find(platform::codePageName());
  if (found == tables.end()) throw std::logic_error("there is no table for " + platform::codePageName());
  return found->second;
}

TEST(ToUtf8, RunsInTheEncodingThatIsMeant) {
  const char* const meant = std::getenv("KTORBA_ENCODING");
  EXPECT_EQ(platform::codePageName(), meant != nullptr ? meant : "UTF-8");
}

TEST(ToUtf8, TakesValidTextAndGivesItBack) {
  EXPECT_EQ(ktsstutf8::toUtf8(nullptr), "");
  for (const auto& [text, utf8] : table().texts) {
    EXPECT_EQ(ktsstutf8::toUtf8(text.c_str()), utf8);
    EXPECT_EQ(platform::encodeCodePage(utf8), text);
  }
}

TEST(ToUtf8, RefusesEverythingElse) {
  for (const std::string& text : table().invalid) {
    EXPECT_EQ(failureOf([&] { ktsstutf8::toUtf8(text.c_str()); }),
              R"(-52027{"error_constant":"err","file":"ktsstutf8/mbsToUtf8","line":77,"component":"ktorbau"})")
        << testing::PrintToString(text);
  }
}

TEST(ToUtf8, TakesNoSimilarCharacterForOneThatIsMissing) {
  for (const std::string& text : table().missing) EXPECT_EQ(platform::encodeCodePage(text), std::nullopt) << text;
}

}  // namespace
