#include "ktsstutf8/toUtf8.h"

#include <gtest/gtest.h>

#include "kterr/Exception.h"

namespace {

TEST(ToUtf8, TakesValidTextAsItIs) {
  EXPECT_EQ(ktsstutf8::toUtf8(nullptr), "");
  for (const char* text : {"", "wave-1\x01\x7F", "\xC2\x80", "\xDF\xBF", "\xE0\xA0\x80", "\xED\x9F\xBF", "\xEE\x80\x80",
                           "\xEF\xBF\xBF", "\xF0\x90\x80\x80", "\xF4\x8F\xBF\xBF", "a\xC3\xB6z"}) {
    EXPECT_EQ(ktsstutf8::toUtf8(text), text);
  }
}

TEST(ToUtf8, RefusesEverythingElse) {
  const struct {
    const char* kind;
    const char* text;
  } rows[] = {
      {"continuation alone", "a\x80"},
      {"sequence cut at the end", "a\xE2\x82"},
      {"sequence cut by a letter", "\xC3z"},
      {"overlong, two bytes", "\xC0\x80"},
      {"overlong, two bytes", "\xC1\xBF"},
      {"overlong, three bytes", "\xE0\x9F\xBF"},
      {"overlong, four bytes", "\xF0\x8F\xBF\xBF"},
      {"first surrogate", "\xED\xA0\x80"},
      {"last surrogate", "\xED\xBF\xBF"},
      {"above U+10FFFF", "\xF4\x90\x80\x80"},
      {"five bytes", "\xF8\x88\x80\x80\x80"},
      {"never a lead byte", "\xFF"},
  };
  for (const auto& row : rows) {
    try {
      ktsstutf8::toUtf8(row.text);
      ADD_FAILURE() << row.kind;
    } catch (const kterr::Exception& error) {
      EXPECT_EQ(error.code(), -52027) << row.kind;
      EXPECT_STREQ(error.what(),
                   R"({"error_constant":"err","file":"ktsstutf8/mbsToUtf8","line":77,"component":"ktorbau"})");
    }
  }
}

}  // namespace
