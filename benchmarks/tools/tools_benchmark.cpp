// Checking a text through the C interface of the tools, beside the compiler alone, which makes records of the same text
// and keeps none of them; and the memory that tokens and tree take beyond what the compiler needs.
#include <benchmark/benchmark.h>

#include <string>

#include "benchmarks/costInNewProcess.h"
#include "benchmarks/programs.h"
#include "ktWfmScriptCompiler/compile.h"
#include "ktorba/script_tools.h"

namespace {

constexpr int kLines = 1'000'000;
constexpr int kLinesPerUnit = 9;
constexpr int kErrors = 20;

const std::string& goodText() {
  static const std::string kText = programs::script(kLines / kLinesPerUnit * programs::kInstructionsPerUnit);
  return kText;
}

// The same with mistyped instructions, evenly parted.
const std::string& faultyText() {
  static const std::string kText = [] {
    std::string text = goodText();
    const std::size_t step = text.size() / (kErrors + 1);
    for (std::size_t at = step; at < step * (kErrors + 1); at += step) {
      text.replace(text.find("  generate", at) + 2, 8, "genreate");
    }
    return text;
  }();
  return kText;
}

void compile(const std::string& text) {
  ktwfmscriptcompiler::ScriptTraits traits = ktwfmscriptcompiler::standardScriptTraits();
  traits.alignmentQuantum = 1;
  traits.minWaitLength = 64;
  benchmark::DoNotOptimize(ktwfmscriptcompiler::compile(text, traits));
}

void check(const std::string& text) {
  ktTools_Document document;
  benchmark::DoNotOptimize(ktTools_Check(text.data(), text.size(), nullptr, 0, &document));
  ktTools_FreeDocument(&document);
}

void tokenize(const std::string& text) {
  ktTools_Token* tokens = nullptr;
  std::uint64_t count = 0;
  benchmark::DoNotOptimize(ktTools_Tokenize(text.data(), text.size(), &tokens, &count));
  ktTools_FreeTokens(tokens);
}

using Work = void (*)(const std::string& text);
using Text = const std::string& (*)();

void measureTime(benchmark::State& state, Work work, Text text) {
  text();
  for (auto _ : state) work(text());
}
BENCHMARK_CAPTURE(measureTime, compiler, compile, goodText)->Name("check/compiler")->MinTime(1);
BENCHMARK_CAPTURE(measureTime, good, check, goodText)->Name("check/good")->MinTime(1);
BENCHMARK_CAPTURE(measureTime, faulty, check, faultyText)->Name("check/faulty")->MinTime(1);

// Bytes per byte of the text, beyond what the compiler takes for the one without errors.
void measureMemory(benchmark::State& state, Work work, Text text) {
  std::int64_t bytes = 0;
  std::int64_t compilers = 0;
  text();
  goodText();
  for (auto _ : state) {
    bytes = costInNewProcess([&] { work(text()); }).bytes;
    compilers = costInNewProcess([] { compile(goodText()); }).bytes;
  }
  const auto size = static_cast<double>(goodText().size());
  state.counters["bytes_per_byte"] = static_cast<double>(bytes) / size;
  state.counters["excess_per_byte"] = static_cast<double>(bytes - compilers) / size;
}
BENCHMARK_CAPTURE(measureMemory, good, check, goodText)->Name("check_memory/good")->Iterations(1);
BENCHMARK_CAPTURE(measureMemory, faulty, check, faultyText)->Name("check_memory/faulty")->Iterations(1);
BENCHMARK_CAPTURE(measureMemory, tokens, tokenize, goodText)->Name("check_memory/tokens")->Iterations(1);

}  // namespace
