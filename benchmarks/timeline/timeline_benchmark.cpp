// What it takes to compute what plays: to build a timeline of a script of as many instructions as the size says, to
// ask it for runs and envelopes of a play of 10^12 samples, and to render samples, against memcpy of the same ones.
#include <benchmark/benchmark.h>

#include <cstring>
#include <random>
#include <stdexcept>
#include <string>
#include <vector>

#include "tools/timeline/LevelRanges.h"
#include "tools/timeline/Renderer.h"
#include "tools/timeline/Timeline.h"

namespace {

using namespace tools;

constexpr std::uint32_t kWaveforms = 8;
constexpr std::uint32_t kWaveformSamples = 1024;
constexpr std::uint64_t kLongPlay = 1'000'000'000'000;

// Loops of four instructions over waveforms of 1024 samples, played often enough to last about `samples`.
std::string scriptOf(std::int64_t instructions, std::uint64_t samples) {
  const std::int64_t loops = std::max<std::int64_t>(instructions / 6, 1);
  const std::uint64_t passes = std::max<std::uint64_t>(samples / static_cast<std::uint64_t>(loops) / 3712, 1);
  std::string text = "script s\n";
  for (std::int64_t loop = 0; loop < loops; ++loop) {
    const std::string waveform = "w" + std::to_string(loop % kWaveforms);
    text += "repeat " + std::to_string(passes) + " generate " + waveform + " marker0(0) wait 640 generate " + waveform +
            " generate " + waveform + " end repeat\n";
  }
  return text + "end script\n";
}

struct Scene {
  Scene(std::int64_t instructions, std::uint64_t samples)
      : generator{.sequenceWords = 1u << 24}, file("bench", scriptOf(instructions, samples)), builder(generator) {
    std::vector<Diagnostic> diagnostics;
    builder.compile(file, diagnostics);
    std::mt19937 random(1);
    for (std::uint32_t waveform = 0; waveform < kWaveforms; ++waveform) {
      SampleBuffer& buffer = waveforms.emplace_back(16);
      for (std::uint32_t i = 0; i < kWaveformSamples; ++i) buffer.push(static_cast<std::int16_t>(random()));
      builder.addWaveform("w" + std::to_string(waveform), kWaveformSamples);
    }
    programs = builder.build(diagnostics);
    if (programs.size() != 1) throw std::runtime_error("the script builds");
  }

  Timeline timeline() const { return {StraightPlay(programs[0], builder), {}}; }
  TimelineWaveforms sources(const Timeline& timeline) const {
    TimelineWaveforms sources;
    for (const std::string& name : timeline.play().waveforms()) {
      sources.push_back(waveforms[static_cast<std::size_t>(name[1] - '0')]);
    }
    return sources;
  }

  GeneratorOptions generator;
  ScriptFile file;
  ProgramBuilder builder;
  std::vector<SampleBuffer> waveforms;
  std::vector<Program> programs;
};

void build(benchmark::State& state) {
  const Scene scene(state.range(0), kLongPlay);
  for (auto _ : state) benchmark::DoNotOptimize(scene.timeline().sampleCount());
  state.SetItemsProcessed(state.iterations() * state.range(0));
}
BENCHMARK(build)->Name("timeline_build/ours")->RangeMultiplier(10)->Range(1'000, 1'000'000);

void findRun(benchmark::State& state) {
  const Scene scene(state.range(0), kLongPlay);
  const Timeline timeline = scene.timeline();
  std::mt19937_64 random(1);
  for (auto _ : state) benchmark::DoNotOptimize(timeline.runAt(random() % timeline.sampleCount()));
}
BENCHMARK(findRun)->Name("timeline_run/ours")->RangeMultiplier(10)->Range(1'000, 1'000'000);

// A thousand columns over a window anywhere, of a size from all that plays down to a thousandth.
void takeEnvelope(benchmark::State& state) {
  const Scene scene(state.range(0), kLongPlay);
  const Timeline timeline = scene.timeline();
  const LevelRanges ranges(timeline, scene.sources(timeline), 16);
  std::mt19937_64 random(1);
  for (auto _ : state) {
    const std::uint64_t width = timeline.sampleCount() / (1 + random() % 1000) / 1000;
    std::uint64_t begin = random() % (timeline.sampleCount() - 1000 * width + 1);
    for (int column = 0; column < 1000; ++column, begin += width) {
      benchmark::DoNotOptimize(ranges.over(begin, begin + width));
    }
  }
}
BENCHMARK(takeEnvelope)->Name("timeline_envelope/ours")->RangeMultiplier(10)->Range(1'000, 1'000'000);

void render(benchmark::State& state) {
  const Scene scene(600, kLongPlay);
  const Timeline timeline = scene.timeline();
  const Renderer renderer(timeline, scene.sources(timeline), 16);
  const auto samples = static_cast<std::uint64_t>(state.range(0));
  SampleBuffer target(16);
  target.resize(samples);
  void* const data = target.data();
  for (auto _ : state) {
    renderer.render(kLongPlay / 2, samples, data, nullptr);
    benchmark::ClobberMemory();
  }
  state.SetItemsProcessed(state.iterations() * state.range(0));
}

void copy(benchmark::State& state) {
  const auto samples = static_cast<std::size_t>(state.range(0));
  std::vector<std::int16_t> source(kWaveforms * kWaveformSamples, 1);
  std::vector<std::int16_t> target(samples);
  for (auto _ : state) {
    for (std::size_t done = 0; done < samples; done += kWaveformSamples) {
      std::memcpy(target.data() + done, source.data() + done % source.size(), kWaveformSamples * 2);
    }
    benchmark::ClobberMemory();
  }
  state.SetItemsProcessed(state.iterations() * state.range(0));
}

void sizes(benchmark::internal::Benchmark* benchmark) {
  benchmark->Arg(1 << 14)->Arg(1 << 19)->Arg(1 << 24)->MinTime(0.3);
}
BENCHMARK(copy)->Name("render/memcpy")->Apply(sizes);
BENCHMARK(render)->Name("render/ours")->Apply(sizes);

}  // namespace
