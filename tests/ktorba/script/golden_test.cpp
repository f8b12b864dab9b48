// Scripts beside the programs that they give, or the failures. In front of the cases of a file stand
//
//   # what the file is about
//   sampleWidthBits 16          (numbers left out stand at their defaults, ScriptScene.h)
//   waveform sine 1000          (name and samples; in memory in this order)
#include "testing/golden.h"

#include <gmock/gmock.h>

#include <iomanip>
#include <map>
#include <sstream>

#include "ktWfmScriptCompiler/compile.h"
#include "ktWfmScriptCompiler/printScript.h"
#include "kterr/Exception.h"
#include "ktorba/script/instructionDecoder.h"
#include "testing/ScriptScene.h"

namespace ktorba {
namespace {

void setUp(const std::string& header, std::unique_ptr<ScriptScene>& scene) {
  std::map<std::string, std::uint32_t> numbers{
      {"sampleWidthBits", 16}, {"samplesPerMemoryWord", 8}, {"minFetchSamples", 64}, {"alignmentQuantum", 1}};
  std::vector<std::pair<std::string, std::uint32_t>> waveforms;
  std::istringstream lines(header);
  for (std::string line; std::getline(lines, line);) {
    std::istringstream words(line);
    std::string key;
    if (!(words >> key) || key == "#") continue;
    if (key == "waveform") {
      ASSERT_TRUE(words >> waveforms.emplace_back().first >> waveforms.back().second) << line;
    } else {
      ASSERT_TRUE(words >> numbers.at(key)) << line;
    }
  }
  scene = std::make_unique<ScriptScene>(SceneNumbers{static_cast<std::uint8_t>(numbers["sampleWidthBits"]),
                                                     numbers["samplesPerMemoryWord"], numbers["minFetchSamples"],
                                                     numbers["alignmentQuantum"]});
  for (const auto& [name, samples] : waveforms) scene->addWaveform(name, samples);
}

std::string describe(const InstructionOrigin& origin) {
  static const char* const kParts[] = {"start", "block ", "block ", "end of block ", "jump", "end"};
  std::string text = kParts[static_cast<int>(origin.part)];
  if (text.ends_with(' ')) text += std::to_string(origin.block);
  if (origin.part == InstructionOrigin::Part::kFetch) text += " fetch " + std::to_string(origin.fetch);
  return text;
}

void print(const BuiltScript& built, std::ostream& out) {
  for (std::size_t i = 0; i < built.origins.size(); ++i) {
    const SequenceInstructionWords& instruction = built.entry.instructionWords[i];
    out << "  " << std::dec << i << ' ' << describe(built.origins[i]) << ":" << std::hex << std::setfill('0');
    for (const std::uint32_t word : instruction.words) out << ' ' << std::setw(8) << word;
    out << "  " << describeInstruction(instruction) << '\n';
  }
  out << std::dec << "  memory words: total " << built.entry.totalMemoryWords << ", finite "
      << built.entry.finiteMemoryWords << '\n';
}

std::string resultOf(ScriptScene& scene, const std::string& text) {
  std::ostringstream out;
  try {
    const std::vector<BuiltScript> scripts = scene.build(text);  // first, so that no failure is kept from the scene
    const auto compiled = ktwfmscriptcompiler::compile(text, scene.scriptTraits);
    for (std::size_t i = 0; i < scripts.size(); ++i) {
      out << ktwfmscriptcompiler::printScript(compiled[i]);
      print(scripts[i], out);
      EXPECT_EQ(findFault(scripts[i], scene), "");
    }
  } catch (const kterr::Exception& failure) {
    out << failure.code() << ' ' << ::describe(failure.what()) << '\n';
  }
  return out.str();
}

class Golden : public testing::TestWithParam<std::filesystem::path> {};

TEST_P(Golden, Agrees) {
  const GoldenFile golden(GetParam());
  std::unique_ptr<ScriptScene> scene;
  setUp(golden.header(), scene);
  golden.check([&](auto& script) { return resultOf(*scene, script); });
}

INSTANTIATE_TEST_SUITE_P(Scripts, Golden, testing::ValuesIn(goldenFiles(KTORBA_GOLDEN_FOLDER)), goldenName);

}  // namespace
}  // namespace ktorba
