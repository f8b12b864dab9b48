// Scripts as the tool sees them: their errors, warnings, instruction words and durations.
#include <gmock/gmock.h>

#include "cli/UserError.h"
#include "cli/program/Workbench.h"
#include "cli/program/faultyScripts.h"
#include "cli/program/listing.h"
#include "cli/program/warnings.h"
#include "cli/utf8.h"

namespace cli {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;

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

class Program_ : public testing::Test {
 protected:
  // Builds the script with the waveforms w (1000 samples) and v (100 samples); its first program.
  const Program& build(const std::string& text) {
    file = std::make_unique<ScriptFile>("s", text);
    workbench = std::make_unique<Workbench>(options);
    diagnostics.clear();
    EXPECT_GT(workbench->compile(*file, diagnostics), 0u) << text;
    workbench->addWaveform("w", 1000);
    workbench->addWaveform("v", 100);
    programs = workbench->build(diagnostics);
    static const Program none;
    return programs.empty() ? none : programs.front();
  }

  std::vector<std::string> list(const std::string& text) {
    const Program& program = build(text);
    std::vector<std::string> meanings;
    for (std::size_t address = 0; address < program.places.size(); ++address) {
      meanings.push_back(std::to_string(program.places[address].positionInLine) + " " +
                         listInstruction(program, address, *workbench).meaning);
    }
    return meanings;
  }

  std::string duration(const std::string& text) {
    const Program& program = build(text);
    return describeDuration(program, *workbench, 1e6);
  }

  GeneratorOptions options;
  std::unique_ptr<ScriptFile> file;
  std::unique_ptr<Workbench> workbench;
  std::vector<Diagnostic> diagnostics;
  std::vector<Program> programs;
};

TEST_F(Program_, EveryInstructionIsTold) {
  EXPECT_THAT(list("script s clear trigger2 trigger7 repeat until trigger3 generate W subset(10, 700) marker1(300) "
                   "wait until trigger1 end repeat repeat forever clear trigger1 wait 100 end repeat end script"),
              ElementsAre("1 wait until start", "34 loop until trigger3, clearing trigger2 trigger7",
                          "56 play W[10, 310)", "56 play W[310, 710), marker1 at 0", "96 wait until trigger1",
                          "34 loop end, back to 2", "127 loop for ever", "157 wait 100, clearing trigger1",
                          "127 loop end, back to 7", "1 end of the script"));
  options.sampleWidthBits = 32;
  EXPECT_THAT(list("script s repeat forever generate v marker0(40) marker7(40) end repeat end script"),
              ElementsAre("1 wait until start", "25 loop once", "25 play v[0, 100), marker0 marker7 at 40",
                          "25 loop end, back to 2", "1 jump to 1"));
}

TEST_F(Program_, DurationsAreCountedOrExplained) {
  EXPECT_EQ(duration("script s repeat 10 generate w end repeat generate v end script"), "10.23 ms");
  EXPECT_EQ(duration("script s repeat forever generate w end repeat end script"), "for ever");
  EXPECT_EQ(duration("script s repeat forever generate w wait until trigger2 end repeat wait 64 end script"),
            "for ever, waiting for trigger2");
  EXPECT_EQ(duration("script s repeat until trigger4 generate w end repeat wait until trigger1 end script"),
            "as long as it waits for trigger1 and trigger4");
  std::string loops;
  for (int i = 0; i < 5; ++i) loops += "repeat 2147483647 wait 2147483647 end repeat ";
  EXPECT_EQ(duration("script s " + loops + "end script"), "longer than can be counted");
}

TEST_F(Program_, FaultsAreFoundWhereTheyAre) {
  build(
      "script a generate w end script\nscript b repeat 2 generate v generate w marker0(0, 8) end repeat end script\n"
      "script c wait 2147483647 generate w subset(0, 8) end script");
  ASSERT_EQ(programs.size(), 1u);
  EXPECT_EQ(programs[0].entry.script.name, "a");
  EXPECT_THAT(placesOf(diagnostics), ElementsAre("2:30 -1074101589", "3:26 -1074101607"));
}

TEST_F(Program_, MissingWaveformsAreNamedOnceAtTheirName) {
  const ScriptFile script("s", "script s generate pulse generate\n// here\npulsf generate PULSE generate w end script");
  Workbench bench(options);
  ASSERT_EQ(bench.compile(script, diagnostics), 1u);
  EXPECT_THAT(bench.usedWaveforms(), ElementsAre("pulse", "pulsf", "w"));
  bench.checkWaveformsAreThere({"W", "puls"}, diagnostics);
  EXPECT_THAT(placesOf(diagnostics), ElementsAre("1:19 -1074101603", "1:25 -1074101603"));
  EXPECT_EQ(diagnostics[0].help, "Did you mean \"puls\"?");
}

TEST_F(Program_, WaveformsTakeWholeMemoryWords) {
  options.memorySizeBytes = 1024;
  Workbench bench(options);
  EXPECT_EQ(bench.addWaveform("a", 65).memoryOffset, 0u);
  EXPECT_EQ(bench.addWaveform("b", 64).memoryOffset, 144u);
  EXPECT_EQ(bench.usedBytes(), 272u);
  EXPECT_EQ(bench.largestFreeBytes(), 752u);
  for (const auto& [name, samples] : {std::pair("A", 64), {"c", 377}, {"d", 63}, {"_e", 64}, {"f g", 64}}) {
    EXPECT_THROW(bench.addWaveform(name, static_cast<std::uint64_t>(samples)), UserError) << name;
  }
}

TEST(GeneratorOptions, ImpossibleTraitsAreRefused) {
  const auto refusal = [](auto change) {
    GeneratorOptions options;
    change(options);
    try {
      checkOptions(options);
      return std::string();
    } catch (const UserError& error) {
      return std::string(error.what());
    }
  };
  EXPECT_EQ(refusal([](GeneratorOptions&) {}), "");
  EXPECT_THAT(refusal([](GeneratorOptions& o) { o.sampleRateHz = 0; }), HasSubstr("--sample-rate"));
  EXPECT_THAT(refusal([](GeneratorOptions& o) { o.memoryWordBytes = 9; }), HasSubstr("whole number of samples"));
  EXPECT_THAT(refusal([](GeneratorOptions& o) { o.memoryWordBytes = 64; }), HasSubstr("at most 16 samples"));
  EXPECT_THAT(refusal([](GeneratorOptions& o) { o.minFetchSamples = 256; }), HasSubstr("--min-fetch"));
  EXPECT_THAT(refusal([](GeneratorOptions& o) { o.sequenceWords = 0; }), HasSubstr("--sequence-memory"));
  EXPECT_THAT(refusal([](GeneratorOptions& o) { o.memorySizeBytes = 8; }), HasSubstr("--memory"));
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
