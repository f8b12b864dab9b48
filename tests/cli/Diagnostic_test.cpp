#include "cli/diagnostics/Diagnostic.h"

#include <gmock/gmock.h>

#include "cli/diagnostics/elaboration.h"
#include "ktWfmScriptCompiler/compile.h"
#include "kterr/Failure.h"

namespace cli {
namespace {

using testing::HasSubstr;

Diagnostic compileError(const std::string& text) {
  ktwfmscriptcompiler::ScriptTraits traits = ktwfmscriptcompiler::standardScriptTraits();
  traits.alignmentQuantum = 8;
  traits.minWaitLength = 64;
  try {
    ktwfmscriptcompiler::compile(text, traits);
  } catch (const kterr::Exception& error) {
    return diagnoseFailure(error.code(), error.getJson());
  }
  return {};
}

std::string show(const std::string& text) { return formatDiagnostic(compileError(text), ScriptFile("s.kts", text)); }

TEST(Diagnostic, TheCaretStandsUnderTheCharacter) {
  const std::pair<const char*, const char*> cases[] = {
      // Tabs stay tabs, so that both lines jump to the same column.
      {"script s\n\t\twait x\nend script", "    2 | \t\twait x\n      | \t\t     ^\n"},
      // Two-byte letters are one column, wide ones two, combining marks none.
      {"script \u00e4\u4e2de\u0301 wait x end script",
       "    1 | script \u00e4\u4e2de\u0301 wait x end script\n"
       "      |                  ^\n"},
      {"script s wait \u4e2d\u4e2d end script", "\n      |               ^~~~\n"},
      {"script s wait \x1b[31m end script", "    1 | script s wait \uFFFD[31m end script\n"},
      {"script s\r\nwait x\r\nend script", "    2 | wait x\n      |      ^\n"},
  };
  for (const auto& [text, expected] : cases) EXPECT_THAT(show(text), HasSubstr(expected)) << text;
}

TEST(Diagnostic, LongLinesAreShownAroundThePlace) {
  const std::string name(1000000, 'n');
  const std::string shown = show("script " + name + " wait x " + name + " end script");
  EXPECT_LT(shown.size(), 1000u);
  EXPECT_THAT(shown, HasSubstr("n wait x n"));
  std::vector<std::string> lines;
  std::istringstream stream(shown);
  for (std::string line; std::getline(stream, line);) lines.push_back(line);
  EXPECT_EQ(lines[1].find("x"), lines[2].find("^") + std::string("\u2026").size() - 1);
}

TEST(Diagnostic, AnyElaborationIsTold) {
  try {
    kterr::Failure(ktorba_errors::kErrorInternalSWError)
        .at("f")
        .message("SomeFunction", "headSkip 17 is above 15")
        .raise();
  } catch (const kterr::Exception& error) {
    EXPECT_THAT(diagnoseFailure(error.code(), error.getJson()).message, HasSubstr(": headSkip 17 is above 15"));
  }
  try {
    kterr::Failure(ktorba_errors::kErrorInvalidNumberOfMarkersOnAWaveform).usage("Number of markers", 16u).raise();
  } catch (const kterr::Exception& error) {
    EXPECT_THAT(diagnoseFailure(error.code(), error.getJson()).message, HasSubstr(": Number of markers 16"));
  }
  for (const char* text :
       {static_cast<const char*>(nullptr), "", "[1]", "{\"translator_info\":{\"ordered_data\":[1,{}]}}",
        "{\"translator_info\":7,\"error_constant\":8}", "{\"x\":\"\xFF\"}"}) {
    EXPECT_EQ(diagnoseFailure(-52005, text).constant, "nKTAPALS100_tStatus_kInvalidParameter");
  }
  EXPECT_EQ(diagnoseFailure(-70009, nullptr).message, "The call failed with code -70009");
}

TEST(ScriptFile, FindsLinesAndPlaces) {
  const ScriptFile file("f",
                        "\xEF\xBB\xBF"
                        "ab\r\n\nc");
  EXPECT_EQ(file.line(1), "ab");
  EXPECT_EQ(file.line(2), "");
  EXPECT_EQ(file.line(3), "c");
  EXPECT_EQ(file.line(4), "");
  EXPECT_EQ(file.placeOf(5).line, 3u);
  EXPECT_EQ(file.placeOf(5).position, 1u);
}

}  // namespace
}  // namespace cli
