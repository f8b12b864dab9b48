// How fast the simulated generator emits, against memcpy of the same samples from and to the same places: a waveform of
// as many samples as the size says, played once per iteration by fetches of 1024 or 64 samples, each with a marker. And
// the memory that opening a generator takes.
#include <benchmark/benchmark.h>

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <vector>

#include "platform/system/residentMemory.h"
#include "testing/SimulatedDevice.h"
#include "testing/require.h"

namespace {

namespace f = ktorba::fetch_field;
using ktorba::Opcode;

ktSim_Traits traitsFor(std::uint32_t samples, std::uint32_t fetchSamples) {
  ktSim_Traits traits = defaultTraits();
  traits.memorySizeBytes = samples * 2;
  traits.sequenceWords = samples / fetchSamples + 1;
  return traits;
}

// Plays one waveform for ever.
std::vector<ktorba::SequenceInstructionWords> programFor(std::uint32_t samples, std::uint32_t fetchSamples) {
  const std::uint32_t samplesPerWord = defaultTraits().memoryWordBytes / 2;
  std::vector<ktorba::SequenceInstructionWords> program;
  for (std::uint32_t first = 0; first < samples; first += fetchSamples) {
    program.push_back(instruction(Opcode::kFetch, {{f::kFirstWord, first / samplesPerWord},
                                                   {f::kWordCount, fetchSamples / samplesPerWord},
                                                   {f::kMarkerMask, 1},
                                                   {f::kMarkerOffset, 8}}));
  }
  program.push_back(instruction(Opcode::kJump));
  return program;
}

void copySamples(benchmark::State& state) {
  const auto samples = static_cast<std::size_t>(state.range(0));
  std::vector<std::int16_t> source(samples, 1);
  std::vector<std::int16_t> target(samples);
  for (auto _ : state) {
    std::memcpy(target.data(), source.data(), samples * 2);
    benchmark::ClobberMemory();
  }
  state.SetItemsProcessed(state.iterations() * state.range(0));
}

void playSamples(benchmark::State& state, std::uint32_t fetchSamples, bool takesMarkers) {
  const auto samples = static_cast<std::uint32_t>(state.range(0));
  SimulatedDevice device(traitsFor(samples, fetchSamples));
  device.fillWithRamp();
  device.program(programFor(samples, fetchSamples));
  device.command(ktorba::Command::kInitiate);
  std::vector<std::int16_t> target(samples);
  std::vector<std::uint8_t> markers(takesMarkers ? samples : 0);
  std::uint8_t* const markersOrNull = takesMarkers ? markers.data() : nullptr;
  for (auto _ : state) {
    require(device.playInto(samples, target.data(), markersOrNull) == samples, "as many samples as asked for");
  }
  state.SetItemsProcessed(state.iterations() * state.range(0));
}

// From what fits the first cache to what fits none. Long enough for the first passes, over memory just mapped, to be
// few.
void sizes(benchmark::internal::Benchmark* benchmark) {
  benchmark->Arg(1 << 14)->Arg(1 << 19)->Arg(1 << 24)->MinTime(0.3);
}

BENCHMARK(copySamples)->Name("emission/memcpy")->Apply(sizes);
BENCHMARK_CAPTURE(playSamples, 1024, 1024, true)->Name("emission_1024/ours")->Apply(sizes);
BENCHMARK_CAPTURE(playSamples, unmarked, 1024, false)->Name("emission_unmarked/ours")->Apply(sizes);
BENCHMARK_CAPTURE(playSamples, 64, 64, true)->Name("emission_64/ours")->Apply(sizes);

void openGenerator(benchmark::State& state) {
  ktSim_Traits traits = defaultTraits();
  traits.memorySizeBytes = static_cast<std::uint32_t>(state.range(0));
  std::int64_t taken = 0;
  for (auto _ : state) {
    const std::int64_t before = platform::residentBytes();
    const SimulatedGenerator generator(traits);
    taken = std::max(taken, platform::residentBytes() - before);
  }
  state.counters["resident_bytes"] = static_cast<double>(taken);
}
BENCHMARK(openGenerator)->Name("simulator_memory/ours")->Arg(1 << 30);

}  // namespace
