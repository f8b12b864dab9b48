// Where scripts have errors and what is surely not meant; what is said of them stands in sessions/.
#include <gmock/gmock.h>

#include "cli/UserError.h"
#include "cli/program/Workbench.h"
#include "cli/program/faultyScripts.h"
#include "cli/program/warnings.h"
#include "cli/utf8.h"

namespace cli {
namespace {

// "line:position code", one for each.
std::vector<std::string> placesOf(const std::vector<Diagnostic>& diagnostics) {
  std::vector<std::string> places;
  for (const Diagnostic& diagnostic : diagnostics) {
    places.push_back(std::to_string(diagnostic.line) + ":" + std::to_string(diagnostic.position) + " " +
                     std::to_string(diagnostic.code));
  }
  return places;
}

std::vector<std::string> errorsOf(const std::string& text) {
  std::vector<Diagnostic> diagnostics;
  const ScriptFile file("s", text);
  Workbench(GeneratorOptions()).compile(file, diagnostics);
  return placesOf(diagnostics);
}

TEST(FaultyScripts, TheFirstErrorOfEachScriptIsFound) {
  const std::pair<const char*, std::vector<std::string>> cases[] = {
      {"script a generate w end script", {}},
      {"", {"0:0 -1074101568"}},
      {"// only a remark", {"1:17 -1074101568"}},
      {"end script", {"1:1 -1074101568"}},
      // An "end script" is missing, in the comment it does not count, and names may be keywords.
      {"script a generate w // end script\nSCRIPT b generate x", {"2:1 -1074101568", "2:20 -1074101568"}},
      {"script script generate end wait 1 end script script b wait 2 end script",
       {"1:28 -1074101549", "1:55 -1074101549"}},
      {"script a repeat 2 repeat 2 generate w end repeat end repeat end script\nscript b wait until trigger1 end "
       "script",
       {"1:19 -1074101560", "2:1 -1074101557"}},
      {"script a repeat 2 generate w end script\nscript b wait 1 end script", {"1:34 -1074101568", "2:10 -1074101549"}},
      // What stands behind a script that none follows is never read.
      {"script a wait 1 end script\njunk script b wait 1 end script", {"1:10 -1074101549"}},
      {"script a generate w end script $", {"1:32 -1074101561"}},
      {"script a generate w_1 end script\r\nscript b generate\tw subset(0, 0) end script",
       {"1:19 -1074101561", "2:10 -1074101564"}},
      {"script a / generate", {"1:11 -1074101568"}},
      {"script a wait 99999999999 script b wait 1 end script", {"1:15 -1074101566", "1:36 -1074101549"}},
  };
  for (const auto& [text, expected] : cases) EXPECT_EQ(errorsOf(text), expected) << text;
}

std::vector<std::string> warningsOf(const std::string& text) {
  std::vector<Diagnostic> diagnostics;
  findWarnings(ScriptFile("s", text), toScriptTraits({}), diagnostics);
  return placesOf(diagnostics);
}

TEST(Warnings, StandAtTheirPlace) {
  const std::pair<const char*, std::vector<std::string>> cases[] = {
      {"script a clear trigger1 generate w end script // end", {}},
      {"script a repeat forever generate w end repeat end script", {}},
      {"script a generate w clear trigger1 end script", {"1:21 0"}},
      // The endless loop that is a script's whole body may hold further loops, endless ones too.
      {"script a repeat forever repeat forever wait 64 end repeat wait 64 end repeat end script", {"1:59 0"}},
      {"script a repeat 2 wait 64 marker3(0) marker1(8) marker3(64, 0) end repeat end script", {"1:27 0"}},
      {"script a generate w marker0(0) marker1(0) end script script b generate w end script", {}},
      {"script a generate w end script repeat", {"1:32 0"}},
  };
  for (const auto& [text, expected] : cases) EXPECT_EQ(warningsOf(text), expected) << text;
}

TEST(Workbench, RefusesWhatIsNoNameOrIsTaken) {
  Workbench bench({});
  bench.addWaveform("a", 64);
  for (const char* name : {"A", "_e", "f g"}) EXPECT_THROW(bench.addWaveform(name, 64), UserError) << name;
}

TEST(Utf8, OnlyValidSequencesAreCharacters) {
  for (const char* valid : {"", "a\u00e9\u4e2d\U0001F600", "\U0010FFFF"}) {
    EXPECT_EQ(findInvalidUtf8(valid), std::nullopt) << valid;
  }
  for (const char* invalid : {"\xC0\x80", "\xE0\x80\x80", "\xED\xA0\x80", "\xF4\x90\x80\x80", "\xE4\xB8", "\x80"}) {
    EXPECT_EQ(findInvalidUtf8(invalid), 0u) << invalid;
  }
  EXPECT_EQ(findInvalidUtf8("ab\xFF"), 2u);
  EXPECT_EQ(toValidUtf8("a\xE4z"), "a\uFFFDz");
}

}  // namespace
}  // namespace cli
