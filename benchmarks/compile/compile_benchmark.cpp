// Script text to instruction words, beside what compiles as many instructions of other languages, and the most memory
// that this takes. Times of spirv-as and wat2wasm are the processor times of their whole processes.
#include <benchmark/benchmark.h>
#include <malloc.h>
#include <sys/resource.h>

#include <cstdlib>
#include <lua.hpp>
#include <string>
#include <utility>
#include <vector>

#include "benchmarks/costInNewProcess.h"
#include "benchmarks/programs.h"
#include "kterr/Exception.h"
#include "ktorba/script/ScriptProcessor.h"
#include "ktorba/script/ScriptTable.h"
#include "ktorba/script/SequenceInstructionsGenerator.h"
#include "ktorba/waveform/WaveformTable.h"
#include "testing/files.h"

namespace {

// A compiler that knows all waveforms of the programs, as a session keeps it.
class Compiler {
 public:
  Compiler() {
    traits_.alignmentQuantum = 8;
    traits_.minWaitLength = 64;
    for (int i = 0; i < programs::kWaveforms; ++i) waveforms_.addWaveform("wave" + std::to_string(i), 8192);
    ktorba::HWTraits hardware;
    hardware.samplesPerMemoryWord = 8;
    hardware.sampleWidthBits = 16;
    encoder_.receiveHWTraits(hardware);
  }

  // As a session writes a text: its scripts stay until those of the next text take their places.
  void compile(const std::string& text) {
    std::vector<ktorba::CompiledScript> scripts;
    processor_.compileScripts(text, scripts);
    for (ktorba::CompiledScript& script : scripts) {
      auto entry = std::make_shared<ktorba::ScriptEntry>();
      processor_.buildInstructionWords(script, waveforms_, *entry);
      entry->script = std::move(script);
      scripts_.addScript(entry->script.name, entry);
    }
  }

 private:
  ktwfmscriptcompiler::ScriptTraits traits_ = ktwfmscriptcompiler::standardScriptTraits();
  ktorba::WaveformTable<ktorba::WaveformEntry> waveforms_;
  ktorba::SequenceInstructionsGenerator encoder_;
  ktorba::ScriptProcessor processor_{traits_, &encoder_, 64};
  ktorba::ScriptTable scripts_;
};

void setRates(benchmark::State& state, const std::string& text) {
  state.SetItemsProcessed(state.iterations() * state.range(0));
  state.SetBytesProcessed(state.iterations() * static_cast<std::int64_t>(text.size()));
}

// Has the C library keep freed memory, ours and the peer's. Sizes are then compared in the same kind of memory: what
// the kernel takes to hand out the same pages again and again would else be added to the large ones alone. The
// benchmark of the first compile, to which all pages are new, shows how much that is. KTORBA_OWN_MEMORY in the
// environment leaves the C library its own rules.
void keepFreedMemory() {
  if (std::getenv("KTORBA_OWN_MEMORY") != nullptr) return;
  mallopt(M_TRIM_THRESHOLD, -1);
  mallopt(M_MMAP_MAX, 0);
}

// Begun long enough before it counts for a million instructions, too, to be compiled in memory that was there before.
void sizes(benchmark::internal::Benchmark* benchmark) {
  benchmark->RangeMultiplier(10)->Range(1'000, 1'000'000)->MinTime(0.5)->MinWarmUpTime(0.5);
}

void compileScript(benchmark::State& state) {
  keepFreedMemory();
  const std::string text = programs::script(static_cast<int>(state.range(0)));
  Compiler compiler;
  for (auto _ : state) compiler.compile(text);
  setRates(state, text);
}
BENCHMARK(compileScript)->Name("compile/ours")->Apply(sizes);

void loadLua(benchmark::State& state) {
  keepFreedMemory();
  const std::string text = programs::lua(static_cast<int>(state.range(0)));
  lua_State* loaded = luaL_newstate();  // stays until the next one takes its place, as our scripts do
  for (auto _ : state) {
    lua_State* const lua = luaL_newstate();
    if (luaL_loadbufferx(lua, text.data(), text.size(), "program", "t") != LUA_OK) {
      state.SkipWithError(lua_tostring(lua, -1));
    }
    lua_close(std::exchange(loaded, lua));
  }
  lua_close(loaded);
  setRates(state, text);
}
BENCHMARK(loadLua)->Name("compile/lua")->Apply(sizes);

double secondsOfChildren() {
  rusage usage{};
  getrusage(RUSAGE_CHILDREN, &usage);
  return secondsOf(usage);
}

void runTool(benchmark::State& state, const char* tool, std::string (*program)(int)) {
  const std::string text = program(static_cast<int>(state.range(0)));
  const TemporaryFolder folder;
  const std::string command = std::string(tool) + " " + folder.write("program", text) + " -o /dev/null";
  for (auto _ : state) {
    const double start = secondsOfChildren();
    if (std::system(command.c_str()) != 0) {
      state.SkipWithError(tool);
      return;
    }
    state.SetIterationTime(secondsOfChildren() - start);
  }
  setRates(state, text);
}
BENCHMARK_CAPTURE(runTool, spirv_as, "spirv-as", programs::spirv)
    ->Name("compile/spirv_as")
    ->Arg(100'000)
    ->UseManualTime();
BENCHMARK_CAPTURE(runTool, wat2wasm, "wat2wasm", programs::webAssembly)
    ->Name("compile/wat2wasm")
    ->Arg(100'000)
    ->UseManualTime();

std::string repeated(const std::string& text, int count) {
  std::string all;
  all.reserve(text.size() * static_cast<std::size_t>(count));
  for (int i = 0; i < count; ++i) all += text;
  return all;
}

constexpr int kMany = 1'000'000;

std::string mixedText() { return programs::script(kMany); }
std::string fetchesText() { return "script s " + repeated("wait 64 ", kMany) + "end script"; }
std::string loopsText() { return "script s " + repeated("repeat 1 wait 64 end repeat ", kMany) + "end script"; }
std::string scriptsText() { return repeated("script s wait 64 end script ", kMany); }
std::string markersText() { return "script s generate wave0 marker0(0" + repeated(",0", kMany) + ") end script"; }
std::string nestedText() {
  return "script s " + repeated("repeat 2 ", kMany) + "wait 64 " + repeated("end repeat ", kMany) + "end script";
}

void measureMemory(benchmark::State& state, std::string (*program)()) {
  const std::string text = program();
  ProcessCost cost;
  for (auto _ : state) {
    cost = costInNewProcess([&] {
      try {
        Compiler().compile(text);
      } catch (const kterr::Exception&) {  // as nested loops must
      }
    });
  }
  state.counters["bytes_per_byte"] = static_cast<double>(cost.bytes) / static_cast<double>(text.size());
  state.counters["process_seconds"] = cost.seconds;
}
BENCHMARK_CAPTURE(measureMemory, mixed, mixedText)->Name("compile_memory/mixed")->Iterations(1);
BENCHMARK_CAPTURE(measureMemory, fetches, fetchesText)->Name("compile_memory/fetches")->Iterations(1);
BENCHMARK_CAPTURE(measureMemory, loops, loopsText)->Name("compile_memory/loops")->Iterations(1);
BENCHMARK_CAPTURE(measureMemory, scripts, scriptsText)->Name("compile_memory/scripts")->Iterations(1);
BENCHMARK_CAPTURE(measureMemory, markers, markersText)->Name("compile_memory/markers")->Iterations(1);
BENCHMARK_CAPTURE(measureMemory, nested, nestedText)->Name("compile_memory/nested")->Iterations(1);

}  // namespace
