// Properties of programs over random scripts, and texts as large as they get.
#include <gmock/gmock.h>

#include <cctype>

#include "ktWfmScriptCompiler/compile.h"
#include "ktWfmScriptCompiler/printScript.h"
#include "testing/RandomScript.h"
#include "testing/ScriptScene.h"

namespace ktorba {
namespace {

// The same text to the compiler: letters of any case, and other blanks and comments between words.
std::string respell(Random& random, const std::string& text) {
  static const std::string kGaps[] = {" ", "\n", "\r\n", "\t \n", " // end script\n", "//\r\n\r\n"};
  std::string spelled;
  for (const char c : text) {
    const std::string& gap = kGaps[pick(random, 0, std::size(kGaps) - 1)];
    if (std::isspace(c)) {
      spelled += gap;
    } else if (std::ispunct(c)) {
      spelled += gap + c + gap;
    } else {
      spelled += static_cast<char>(pick(random, 0, 1) == 0 ? c : std::toupper(c));
    }
  }
  return spelled;
}

std::vector<std::vector<SequenceInstructionWords>> programsOf(const std::vector<BuiltScript>& scripts) {
  std::vector<std::vector<SequenceInstructionWords>> programs;
  for (const BuiltScript& built : scripts) programs.push_back(built.entry.instructionWords);
  return programs;
}

TEST(Programs, PlayRandomScriptsHoweverSpelled) {
  forEachSeed(600, [](Random& random) {
    const SceneNumbers numbers{static_cast<std::uint8_t>(16 * pick(random, 1, 2)), 8 * pick(random, 1, 2), 64, 1};
    ScriptScene scene(numbers);
    const scripts::Waveforms waveforms = scripts::randomWaveforms(random, 565, 1000, 16);
    for (const auto& [name, samples] : waveforms) scene.addWaveform(name, static_cast<std::uint32_t>(samples.size()));
    const std::string text = scripts::randomScript(random, waveforms, numbers.minFetchSamples);
    SCOPED_TRACE(text);
    const std::vector<BuiltScript> scripts = scene.build(text);
    for (const BuiltScript& built : scripts) ASSERT_EQ(findFault(built, scene), "");
    ASSERT_EQ(programsOf(scene.build(respell(random, text))), programsOf(scripts));
    const std::string printed = ktwfmscriptcompiler::printAsScript(
        ktwfmscriptcompiler::compile(text, scene.scriptTraits)[0], scene.scriptTraits);
    ASSERT_EQ(programsOf(scene.build(printed)), programsOf(scripts)) << printed;
  });
}

TEST(Programs, HoldAMillionMarkersOnOneGenerate) {
  constexpr std::uint32_t kMarkers = 1'000'000;
  ScriptScene scene({16, 8, 8, 1});
  scene.addWaveform("w", 8 * kMarkers);
  std::string text = "script s generate w marker1(0";
  for (std::uint32_t i = 1; i < kMarkers; ++i) text += ',' + std::to_string(8 * i);
  const std::vector<BuiltScript> scripts = scene.build(text + ") end script");
  EXPECT_EQ(scripts[0].entry.instructionWords.size(), kMarkers + 4);
  EXPECT_EQ(findFault(scripts[0], scene), "");
}

}  // namespace
}  // namespace ktorba
