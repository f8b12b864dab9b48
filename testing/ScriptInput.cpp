#include "testing/ScriptInput.h"

#include "ktWfmScriptCompiler/compile.h"
#include "ktWfmScriptCompiler/printScript.h"
#include "kterr/Exception.h"
#include "kterr/JsonReader.h"
#include "testing/ScriptScene.h"
#include "testing/require.h"

namespace {

using ktorba::BuiltScript;
using ktorba::ScriptScene;

constexpr std::size_t kLetters = 5;
using Choices = std::uint32_t[8];
constexpr Choices kSampleWidthBits{16, 32, 8, 24, 7, 12, 64, 255};
constexpr Choices kSamplesPerMemoryWord{8, 16, 4, 1, 2, 32, 0, 100};
constexpr Choices kMinFetchSamples{64, 8, 1, 2, 100, 200, 0, 255};
constexpr Choices kAlignmentQuantum{1, 8, 2, 3, 0, 16, 64, 2147483647};
constexpr Choices kWaveformSamples{1000, 64, 4096, 8, 1, 0, 1000000, 333};

std::uint32_t choose(const Choices& choices, char letter) { return choices[(letter - 'a') & 7]; }

ktorba::SceneNumbers numbersOf(std::string_view letters) {
  return {static_cast<std::uint8_t>(choose(kSampleWidthBits, letters[0])), choose(kSamplesPerMemoryWord, letters[1]),
          choose(kMinFetchSamples, letters[2]), choose(kAlignmentQuantum, letters[3])};
}

// Printing a compiled script and compiling that gives the same program.
void checkPrinted(const std::string& text, ScriptScene& scene, const std::vector<BuiltScript>& scripts) {
  const auto compiled = ktwfmscriptcompiler::compile(text, scene.scriptTraits);
  for (std::size_t i = 0; i < scripts.size(); ++i) {
    const std::string printed = printAsScript(compiled[i], scene.scriptTraits);
    require(scene.build(printed).at(0).entry.instructionWords == scripts[i].entry.instructionWords, printed);
  }
}

std::int32_t run(const std::string& text, ScriptScene& scene) {
  std::vector<BuiltScript> scripts;
  try {
    scripts = scene.build(text);
  } catch (const kterr::Exception& failure) {
    require(failure.code() < 0 && failure.getJson() != nullptr, "failure without code or elaboration");
    require(kterr::findEnd(failure.status().json) != nullptr, failure.getJson());
    return failure.code();
  }
  for (const BuiltScript& built : scripts) {
    const std::string fault = findFault(built, scene);
    require(fault.empty(), fault);
  }
  checkPrinted(text, scene, scripts);
  return 0;
}

}  // namespace

std::int32_t runScriptInput(std::string_view input) {
  if (input.size() < kLetters) return 0;
  const std::string_view letters = input.substr(input.size() - kLetters);
  input.remove_suffix(kLetters);
  ScriptScene scene(numbersOf(letters));
  for (const char* const name : {"a", "b", "c"}) scene.addWaveform(name, choose(kWaveformSamples, letters[4]));
  return run(std::string(input), scene);
}
