// Properties of programs over random scripts, and texts as large as they get.
#include <gmock/gmock.h>

#include <cstdlib>
#include <random>

#include "ktWfmScriptCompiler/compile.h"
#include "ktWfmScriptCompiler/printScript.h"
#include "kterr/Exception.h"
#include "ktorba/script/ScriptScene.h"

namespace ktorba {
namespace {

// Writes scripts as sequences of words, in which blanks and letter case are still open.
class RandomScript {
 public:
  explicit RandomScript(std::uint32_t seed) : random_(seed) {}

  std::vector<std::string> words() {
    std::vector<std::string> script{"script", "s" + std::to_string(below(9))};
    const bool endless = below(4) == 0;
    if (endless) append(script, {"repeat", "forever"});
    for (std::uint32_t i = 0, count = 1 + below(6); i < count; ++i) below(4) == 0 ? loop(script) : fetch(script);
    if (endless) append(script, {"end", "repeat"});
    append(script, {"end", "script"});
    return script;
  }

  // One text of these words: all letters small and one blank between words, or anything that means the same.
  std::string spell(const std::vector<std::string>& words, bool wildly) {
    static const char* const kBlanks[] = {" ", "\n", "\r\n", "\t \n", " // end script\n", "//\r\n\r\n"};
    std::string text;
    for (const std::string& word : words) {
      for (const char c : word) text += wildly && below(2) ? static_cast<char>(std::toupper(c)) : c;
      text += wildly ? kBlanks[below(std::size(kBlanks))] : " ";
    }
    return text;
  }

  std::uint32_t below(std::size_t limit) { return static_cast<std::uint32_t>(random_() % limit); }

 private:
  using Words = std::vector<std::string>;
  static void append(Words& words, const Words& more) { words.insert(words.end(), more.begin(), more.end()); }

  void loop(Words& words) {
    const Words heads[] = {
        {"repeat", std::to_string(1 + below(1000))}, {"repeat", "until", "trigger3"}, {"repeat", "forever"}};
    append(words, heads[below(3)]);
    for (std::uint32_t i = 0, count = 1 + below(3); i < count; ++i) fetch(words);
    append(words, {"end", "repeat"});
  }

  void fetch(Words& words) {
    if (below(4) == 0) append(words, {"clear", "trigger1", "trigger7"});
    std::uint32_t length = 1000;
    if (below(5) == 0) {
      length = 64 + below(1000);
      append(words, {"wait", std::to_string(length)});
    } else if (append(words, {"generate", below(2) ? "long" : "song"}); words.back() == "song" || below(2)) {
      length = 64 + below(400);
      append(words, {"subset", "(", std::to_string(below(100)), ",", std::to_string(length), ")"});
    }
    std::uint32_t position = below(100);
    for (; below(3) != 0 && position < length; position += 64 + below(200)) {
      append(words, {"marker" + std::to_string(below(8)), "(", std::to_string(position), ")"});
    }
  }

  std::mt19937 random_;
};

std::vector<std::vector<SequenceInstructionWords>> programsOf(const std::vector<BuiltScript>& scripts) {
  std::vector<std::vector<SequenceInstructionWords>> programs;
  for (const BuiltScript& built : scripts) programs.push_back(built.entry.instructionWords);
  return programs;
}

TEST(Programs, PlayRandomScriptsHoweverSpelled) {
  const char* const seedText = std::getenv("KTORBA_TEST_SEED");
  const auto firstSeed = static_cast<std::uint32_t>(seedText == nullptr ? 1 : std::atol(seedText));
  int accepted = 0;
  for (std::uint32_t seed = firstSeed; seed < firstSeed + 600; ++seed) {
    RandomScript random(seed);
    ScriptScene scene({static_cast<std::uint8_t>(seed % 2 ? 16 : 32), seed % 3 ? 8u : 16u, 64, 1});
    scene.addWaveform("song", 565);
    scene.addWaveform("LONG", 1000);
    const std::vector<std::string> words = random.words();
    const std::string text = random.spell(words, false);
    SCOPED_TRACE("seed " + std::to_string(seed) + ": " + text);
    try {
      const std::vector<BuiltScript> scripts = scene.build(text);
      for (const BuiltScript& built : scripts) ASSERT_EQ(findFault(built, scene), "");
      ASSERT_EQ(programsOf(scene.build(random.spell(words, true))), programsOf(scripts));
      const std::string printed = ktwfmscriptcompiler::printAsScript(
          ktwfmscriptcompiler::compile(text, scene.scriptTraits)[0], scene.scriptTraits);
      ASSERT_EQ(programsOf(scene.build(printed)), programsOf(scripts)) << printed;
      ++accepted;
    } catch (const kterr::Exception& failure) {
      // Only markers are drawn without regard to the rules that hold between them.
      ASSERT_THAT(failure.what(), testing::HasSubstr("arker"));
    }
  }
  EXPECT_GT(accepted, 300);
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
