#include "kterr/JsonReader.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>

namespace kterr {
namespace {

// Offset that a reader found in a copy of `text`, or -1.
template <typename Reader, typename... Arguments>
std::ptrdiff_t offset(Reader reader, std::string text, Arguments... arguments) {
  const char* found = reader(text.data(), arguments...);
  return found != nullptr ? found - text.data() : -1;
}

TEST(JsonReader, ParsesOneValue) {
  const auto expectWhole = [](const std::string& text) {
    EXPECT_EQ(offset(parseValue, text), static_cast<std::ptrdiff_t>(text.size())) << text;
    EXPECT_EQ(offset(parseValue, text + " x"), static_cast<std::ptrdiff_t>(text.size())) << text;
  };
  for (const char* text :
       {"0", "-", "1.", "-007.5e+3", "true", "false", "null", "{}", "[ \t\r\n]", "\"\"", "\"\u00FC\""}) {
    expectWhole(text);
  }
  expectWhole(R"("a\"\/\\\b\f\n\r\t\u00fF")");
  expectWhole(R"({"a" : [1 ,{"b":null}] , "c":""})");
  EXPECT_EQ(offset(parseValue, "1e"), 1);
  EXPECT_EQ(offset(parseValue, "truefalse"), 4);
  for (const char* text : {"",   " 1",   "\"",  "\"a\x01\"", "\"\x7F\"", R"("\)",      R"("\x")", R"("\u12g4")",
                           "+1", "tru",  "{",   "{\"a\"}",   "{\"a\":}", "{\"a\":1,}", "{1:2}",   "[",
                           "[1", "[1,]", "[,]", "[1}",       "{\"a\":1]"}) {
    EXPECT_EQ(offset(parseValue, text), -1) << text;
  }
}

TEST(JsonReader, TakesDepthWithinItsBoundAndNoMore) {
  const auto nested = [](std::size_t depth) { return std::string(depth, '[') + "1" + std::string(depth, ']'); };
  EXPECT_EQ(offset(parseValue, nested(kMaxJsonDepth)), 2 * kMaxJsonDepth + 1);
  EXPECT_EQ(offset(parseValue, nested(1'000'000)), -1);
  EXPECT_EQ(offset(parseValue, std::string(1'000'000, '[')), -1);
}

TEST(JsonReader, FindsTheEndOfAContainer) {
  EXPECT_EQ(offset(findEnd, R"({"a":"}"}x)"), 8);
  EXPECT_EQ(offset(findEnd, "[[],{}]"), 6);
  for (const char* text : {"", "1", " {}", "{", "[1"}) EXPECT_EQ(offset(findEnd, text), -1) << text;
}

TEST(JsonReader, FindsTopLevelMembersOnly) {
  for (const auto& [text, key, position] :
       {std::tuple{R"({"x":{"translator":"y"},"translator":"z"})", "translator", 37},
        {" \t{ \"a\" :\n1}", "a", 10},
        {R"({"a":1,"a":2})", "a", 5},
        {R"({"ab":1,"a":2})", "a", 12},
        {R"({"a":1})", "ab", -1},
        {R"({"\u0041\n\/\ud83d\uDE00\u00fc\u20ac":1})", "A\n/\U0001F600\u00FC\u20AC", 38},
        {R"({"a\u0000":1,"":2})", "a", -1},
        {R"({"a":1,})", "b", -1},
        {R"({"a":x,"b":1})", "b", -1},
        {R"([{"a":1}])", "a", -1},
        {"{}", "", -1}}) {
    EXPECT_EQ(offset(findKey, text, key), position) << text;
  }
}

}  // namespace
}  // namespace kterr
