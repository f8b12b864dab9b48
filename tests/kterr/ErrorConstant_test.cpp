#include "kterr/ErrorConstant.h"

#include <gtest/gtest.h>

#include <set>
#include <string>

namespace {

// Their names in C are told apart by the compiler.
TEST(ErrorConstant, TextsAndCodesTellErrorsApart) {
  std::set<std::string> texts;
  std::set<std::int32_t> codes;
  for (const kterr::ErrorConstant& constant : kterr::allErrorConstants()) {
    const std::string text = constant.text != nullptr ? constant.text : "";
    EXPECT_LT(constant.code, 0);
    EXPECT_TRUE(text.empty() || text == "err" || texts.insert(text).second) << text;
    // Memory that cannot be had has one code, wherever it was asked for.
    EXPECT_TRUE(constant.code == -52000 || codes.insert(constant.code).second) << constant.code;
  }
}

}  // namespace
