// Waveform writes against the platform calls alone: a long one against a bare loop of FIFO writes in the same chunks, a
// short one against all the calls that it makes. The platform libraries are doubles that do no more than copy the data
// into a FIFO's memory of 40960 bytes.
#include <benchmark/benchmark.h>
#include <time.h>

#include <algorithm>
#include <numeric>
#include <span>
#include <vector>

#include "benchmarks/HostOnDouble.h"

namespace {

using ktorba::Register;

constexpr std::uint64_t kChunkBytes = 32768;  // the library's own size at first
constexpr std::uint32_t kShortSamples = 64;
constexpr char kName[] = "waveform";

constexpr std::int64_t kLongestBytes = 1 << 26;

// The first `bytes` bytes of the same samples for ours and the bare calls, on the same pages of memory.
std::span<const std::int16_t> samplesOf(std::int64_t bytes) {
  static const std::vector<std::int16_t> samples = [] {
    std::vector<std::int16_t> longest(kLongestBytes / sizeof(std::int16_t));
    std::iota(longest.begin(), longest.end(), std::int16_t{0});
    return longest;
  }();
  return {samples.data(), static_cast<std::size_t>(bytes) / sizeof(std::int16_t)};
}

void write(benchmark::State& state, const HostOnDouble& host, std::span<const std::int16_t> samples) {
  require(state, ktORBA_WriteWaveformI16(host.session, kName, samples.data(),
                                         static_cast<std::uint32_t>(samples.size()), 60'000, nullptr));
}

void rewind(benchmark::State& state, const HostOnDouble& host) {
  require(state, ktORBA_SetWaveformNextWritePosition(host.session, kName, 0, ktORBA_kFromStart, nullptr));
}

void writeWaveform(benchmark::State& state) {
  const auto samples = samplesOf(state.range(0));
  const HostOnDouble host(state);
  write(state, host, samples);  // also allocates it
  FpgaDouble& fpga = fpgaDouble();
  fpga = {fpga.callCount, samples.data(), samples.size_bytes(), 0};
  for (auto _ : state) {
    rewind(state, host);
    write(state, host, samples);
  }
  state.SetBytesProcessed(state.iterations() * state.range(0));
  state.counters["bytes_copied"] = static_cast<double>(fpga.bytesFromElsewhere);
}

void writeBare(std::span<const std::int16_t> samples) {
  const auto* bytes = reinterpret_cast<const std::uint8_t*>(samples.data());
  const std::uint64_t count = samples.size_bytes();
  for (std::uint64_t i = 0; i < count; i += kChunkBytes) bare::writeFifo(bytes + i, std::min(kChunkBytes, count - i));
}

void writeFifo(benchmark::State& state) {
  const auto samples = samplesOf(state.range(0));
  for (auto _ : state) writeBare(samples);
  state.SetBytesProcessed(state.iterations() * state.range(0));
}

// From half a chunk to 64 MiB.
BENCHMARK(writeWaveform)->Name("download/ours")->RangeMultiplier(16)->Range(1 << 14, kLongestBytes);
BENCHMARK(writeFifo)->Name("download/bare")->RangeMultiplier(16)->Range(1 << 14, kLongestBytes);

double processorSeconds() {
  timespec time{};
  clock_gettime(CLOCK_THREAD_CPUTIME_ID, &time);
  return static_cast<double>(time.tv_sec) + 1e-9 * static_cast<double>(time.tv_nsec);
}

// Ours and the bare loop in turns, since memory is faster or slower from one moment to the next.
void writeInTurns(benchmark::State& state) {
  const auto samples = samplesOf(state.range(0));
  const HostOnDouble host(state);
  write(state, host, samples);
  double ours = 0;
  double bare = 0;
  for (auto _ : state) {
    rewind(state, host);
    const double start = processorSeconds();
    write(state, host, samples);
    const double middle = processorSeconds();
    writeBare(samples);
    bare += processorSeconds() - middle;
    ours += middle - start;
  }
  state.counters["ours_seconds"] = benchmark::Counter(ours, benchmark::Counter::kAvgIterations);
  state.counters["bare_seconds"] = benchmark::Counter(bare, benchmark::Counter::kAvgIterations);
}
BENCHMARK(writeInTurns)->Name("download/in_turns")->Arg(kLongestBytes)->MinTime(0.5);

void writeShort(benchmark::State& state) {
  constexpr std::uint32_t kWritesPerWaveform = 4096;
  const auto samples = samplesOf(kShortSamples * 2);
  const HostOnDouble host(state);
  require(state, ktORBA_AllocateWaveform(host.session, kName, kShortSamples * kWritesPerWaveform, nullptr));
  write(state, host, samples);
  const PlatformCallCounter counter(state);
  std::uint32_t writes = 1;
  for (auto _ : state) {
    if (++writes > kWritesPerWaveform) {
      rewind(state, host);
      writes = 1;
    }
    write(state, host, samples);
  }
}

void writeShortBare(benchmark::State& state) {
  const auto samples = samplesOf(kShortSamples * 2);
  const auto* bytes = reinterpret_cast<const std::uint8_t*>(samples.data());
  const PlatformCallCounter counter(state);
  for (auto _ : state) {
    bare::announceMemoryWrite();
    bare::writeFifo(bytes, 0);  // learns the free space
    bare::writeFifo(bytes, kShortSamples * 2);
    benchmark::DoNotOptimize(bare::readRegister(Register::kGenerationStatus));
  }
}

BENCHMARK(writeShort)->Name("short_write/ours");
BENCHMARK(writeShortBare)->Name("short_write/bare");

}  // namespace
