// How fast the simulated generator emits, against memcpy of the same samples from and to the same places: a waveform of
// as many samples as the size says, played once per iteration by fetches of 1024 or 64 samples, each with a marker. And
// the memory that opening a generator takes.
#include <benchmark/benchmark.h>
#include <unistd.h>

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <numeric>
#include <vector>

#include "ktorba/script/instructionFormat.h"
#include "ktorba/simulator.h"
#include "platform/fpga/ktifwu.h"

namespace {

namespace f = ktorba::fetch_field;
using ktorba::Opcode;
using ktorba::SequenceInstructionWords;

void require(std::int32_t code) {
  if (code != 0) std::abort();
}

SequenceInstructionWords instruction(Opcode opcode) {
  SequenceInstructionWords words;
  writeField(words, ktorba::kOpcodeField, static_cast<std::uint32_t>(opcode));
  return words;
}

// Plays one waveform for ever.
class Device {
 public:
  Device(std::uint32_t samples, std::uint32_t fetchSamples) {
    ktSim_Traits traits;
    ktSim_DefaultTraits(&traits);
    traits.memorySizeBytes = samples * 2;
    traits.sequenceWords = samples / fetchSamples + 1;
    const std::uint32_t samplesPerWord = traits.memoryWordBytes / 2;
    require(ktSim_CreateFpga(&fpga_));
    require(ktSim_AddGenerator(fpga_.fpgaSession, &traits, &generator));
    std::vector<std::int16_t> waveform(samples);
    std::iota(waveform.begin(), waveform.end(), std::int16_t{0});
    require(ktSim_WriteSampleMemory(generator, 0, waveform.data(), samples * 2));
    std::vector<SequenceInstructionWords> program;
    for (std::uint32_t first = 0; first < samples; first += fetchSamples) {
      program.push_back(instruction(Opcode::kFetch));
      writeField(program.back(), f::kFirstWord, first / samplesPerWord);
      writeField(program.back(), f::kWordCount, fetchSamples / samplesPerWord);
      writeField(program.back(), f::kMarkerMask, 1);
      writeField(program.back(), f::kMarkerOffset, 8);
    }
    program.push_back(instruction(Opcode::kJump));
    require(ktSim_WriteSequenceMemory(generator, 0, program.front().words.data(), program.size()));
    std::uint32_t context = 0;
    std::uint8_t subsystem = 0;
    std::uint64_t command = 0;
    ktIFW_Context_GetChild(fpga_.ifwSession, 101, 0, fpga_.parentContext, &context, nullptr);
    ktIFW_Context_Contextualize(fpga_.ifwSession, context, 7, &subsystem, &command, nullptr);
    ktIFW_Target_Write(fpga_.ifwTarget, subsystem, command, 2, true, 1000, nullptr);
  }
  ~Device() { ktSim_DestroyFpga(fpga_.fpgaSession); }
  Device(const Device&) = delete;
  Device& operator=(const Device&) = delete;

  std::uint32_t generator = 0;

 private:
  ktSim_Fpga fpga_{};
};

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
  const Device device(static_cast<std::uint32_t>(state.range(0)), fetchSamples);
  const auto samples = static_cast<std::uint64_t>(state.range(0));
  std::vector<std::int16_t> target(samples);
  std::vector<std::uint8_t> markers(takesMarkers ? samples : 0);
  std::uint8_t* const markersOrNull = takesMarkers ? markers.data() : nullptr;
  for (auto _ : state) {
    std::uint64_t played = 0;
    require(ktSim_AdvanceInto(device.generator, samples, target.data(), markersOrNull, &played));
    if (played != samples) std::abort();
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

double residentBytes() {
  long total = 0;
  long resident = 0;
  std::ifstream("/proc/self/statm") >> total >> resident;
  return static_cast<double>(resident * sysconf(_SC_PAGESIZE));
}

void openGenerator(benchmark::State& state) {
  ktSim_Traits traits;
  ktSim_DefaultTraits(&traits);
  traits.memorySizeBytes = static_cast<std::uint32_t>(state.range(0));
  double taken = 0;
  for (auto _ : state) {
    ktSim_Fpga fpga;
    std::uint32_t generator = 0;
    const double before = residentBytes();
    require(ktSim_CreateFpga(&fpga));
    require(ktSim_AddGenerator(fpga.fpgaSession, &traits, &generator));
    taken = std::max(taken, residentBytes() - before);
    require(ktSim_DestroyFpga(fpga.fpgaSession));
  }
  state.counters["resident_bytes"] = taken;
}
BENCHMARK(openGenerator)->Name("simulator_memory/ours")->Arg(1 << 30);

}  // namespace
