#include "ktWfmScriptCompiler/compile.h"

#include <gtest/gtest.h>

#include "ScriptTest.h"
#include "ktWfmScriptCompiler/Compiler.h"
#include "ktWfmScriptCompiler/printScript.h"
#include "testing/caught.h"

namespace ktwfmscriptcompiler {
namespace {

std::string errorOf(const std::string& text) {
  return failureOf([&] { compile(text, testTraits()); });
}

std::string repeated(const std::string& text, int count) {
  std::string all;
  for (int i = 0; i < count; ++i) all += text;
  return all;
}

TEST(Compile, HandlesHugeTexts) {
  const int many = 200000;
  const std::string nested = "script s " + repeated("repeat 2 ", many) + "generate a ";
  EXPECT_NE(errorOf(nested + repeated("end repeat ", many) + "end script").find("NestingTooDeep"), std::string::npos);
  EXPECT_NE(errorOf(nested).find("\"end\""), std::string::npos);
  EXPECT_EQ(compile(repeated("script s wait 64 end script ", many), testTraits()).size(), std::size_t{many});
  EXPECT_NE(errorOf("script s generate " + std::string(10 << 20, 'a')).find("\"end\""), std::string::npos);
  EXPECT_NE(errorOf(std::string(10 << 20, '\n')).find(":10485761,"), std::string::npos);

  std::string descending = "script s generate a marker0(" + std::to_string(8 * many);
  for (int i = many - 1; i >= 0; --i) descending += "," + std::to_string(8 * i);
  const auto scripts = compile(descending + ") marker1(8) end script", testTraits());
  const MarkerRecords& markers = scripts[0].blocks[0].fetches[0].markers;
  ASSERT_EQ(markers.size(), many + 1u);
  EXPECT_EQ(markers[1], (MarkerRecord{8, 3}));
}

TEST(Compile, TakesEveryByteEverywhere) {
  const std::string text = "script s generate a subset(0, 8) marker0(0) clear trigger1 wait 64 // c\n end script";
  for (std::size_t place = 0; place <= text.size(); ++place) {
    for (int byte = 0; byte < 256; ++byte) {
      std::string mutated = text;
      mutated.insert(place, 1, static_cast<char>(byte));
      try {
        const auto scripts = compile(mutated, testTraits());
        ASSERT_EQ(compile(printAsScript(scripts.at(0), testTraits()), testTraits()).at(0), scripts[0]) << mutated;
      } catch (const kterr::Exception& failure) {
        ASSERT_LE(failure.code(), -1074101549);
        ASSERT_GE(failure.code(), -1074101568);
      }
    }
  }
}

TEST(Translation, RefusesTreesOfUnknownKinds) {
  const auto codeOf = [](TokenType clearType, std::uint32_t trigger, RepeatType repeatType) {
    ProcedureCollection tree;
    auto& procedure = tree.create<NamedProcedure>({1, 1});
    auto& clear = tree.create<ClearInstruction>({1, 1});
    clear.type = clearType;
    clear.triggers = tree.store(std::vector{trigger});
    auto& repeat = tree.create<RepeatInstruction>({1, 1});
    repeat.repeatType = repeatType;
    repeat.iterationCount = 1;
    repeat.instructions.append(tree.create<GenerateInstruction>({1, 1}));
    procedure.instructions.append(clear);
    procedure.instructions.append(repeat);
    tree.procedures.append(procedure);
    const ScriptTraits traits = testTraits();
    ScriptCollector scripts;
    return failureOf([&] { Compiler(traits).translate(tree, scripts); }).substr(0, 11);
  };
  EXPECT_EQ(codeOf(TokenType::kClear, 7, RepeatType::kCounted), "");
  EXPECT_EQ(codeOf(TokenType::kIf, 7, RepeatType::kCounted), "-1074097800");
  EXPECT_EQ(codeOf(TokenType::kWait, 7, RepeatType::kCounted), "-1074097800");
  EXPECT_EQ(codeOf(TokenType::kClear, 8, RepeatType::kCounted), "-1074097800");
  EXPECT_EQ(codeOf(TokenType::kClear, 7, static_cast<RepeatType>(4)), "-1074097800");
}

}  // namespace
}  // namespace ktwfmscriptcompiler
