// Every example of the language guide, compiled: ```ktorba blocks without an error, ```ktorba-error blocks with theirs.
#include <gtest/gtest.h>

#include <sstream>

#include "ScriptTest.h"
#include "kterr/ErrorConstant.h"
#include "testing/files.h"

namespace ktwfmscriptcompiler {
namespace {

TEST(Guide, ExamplesCompileAsItSays) {
  const std::string guideText = readFile(KTORBA_GUIDE);
  std::istringstream guide(guideText);
  ScriptTraits traits = standardScriptTraits();
  traits.minWaitLength = 64;
  int examples = 0;
  for (std::string line; std::getline(guide, line);) {
    if (!line.starts_with("```ktorba")) continue;
    const std::string constant = line.starts_with("```ktorba-error ") ? line.substr(16) : "";
    std::string text;
    while (std::getline(guide, line) && line != "```") text += line + "\n";
    const std::string error = failureOf([&] { compile(text, traits); });
    EXPECT_EQ(error.empty(), constant.empty()) << text << error;
    EXPECT_NE(error.find(constant), std::string::npos) << text << error;
    ++examples;
  }
  EXPECT_GE(examples, 20);
  for (const kterr::ErrorConstant& each : kterr::allErrorConstants()) {
    const std::string text = each.text == nullptr ? "" : each.text;
    const std::string scope = "ktwfmscriptcompiler_errors::";
    EXPECT_TRUE(!text.starts_with(scope) || guideText.find(text.substr(scope.size())) != std::string::npos) << text;
  }
}

}  // namespace
}  // namespace ktwfmscriptcompiler
