#include "ktsstutf8/toUtf8.h"

#include <gtest/gtest.h>

#include "testing/caught.h"

namespace {

TEST(ToUtf8, TakesValidTextAsItIs) {
  EXPECT_EQ(ktsstutf8::toUtf8(nullptr), "");
  for (const char* text : {"", "wave-1\x01\x7F", "\xC2\x80", "\xDF\xBF", "\xE0\xA0\x80", "\xED\x9F\xBF", "\xEE\x80\x80",
                           "\xEF\xBF\xBF", "\xF0\x90\x80\x80", "\xF4\x8F\xBF\xBF", "a\xC3\xB6z"}) {
    EXPECT_EQ(ktsstutf8::toUtf8(text), text);
  }
}

TEST(ToUtf8, RefusesEverythingElse) {
  for (const char* text : {
           "a\x80", "\xFF", "\xF8\x88\x80\x80\x80",                     // no lead byte
           "a\xE2\x82", "\xC3z",                                        // cut
           "\xC0\x80", "\xC1\xBF", "\xE0\x9F\xBF", "\xF0\x8F\xBF\xBF",  // overlong
           "\xED\xA0\x80", "\xED\xBF\xBF",                              // surrogates
           "\xF4\x90\x80\x80",                                          // above U+10FFFF
       }) {
    EXPECT_EQ(failureOf([text] { ktsstutf8::toUtf8(text); }),
              R"(-52027{"error_constant":"err","file":"ktsstutf8/mbsToUtf8","line":77,"component":"ktorbau"})")
        << testing::PrintToString(text);
  }
}

}  // namespace
