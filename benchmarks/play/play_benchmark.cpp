// What a play costs that goes into a sound file, from the first call of the library to the file under its name, against
// writing the same samples with the sound library alone; and the most memory that a long one takes.
#include <benchmark/benchmark.h>
#include <sndfile.h>

#include <algorithm>
#include <cstdint>
#include <vector>

#include "benchmarks/costInNewProcess.h"
#include "cli/LoadedScript.h"
#include "cli/commands/ComputedPlay.h"
#include "cli/commands/SimulatedPlay.h"
#include "testing/files.h"
#include "testing/require.h"

namespace {

using tools::cli::ComputedPlay;
using tools::cli::LoadedScript;
using tools::cli::PlayOptions;

constexpr std::uint64_t kWaveformSamples = 1 << 20;
constexpr std::size_t kSamplesPerWrite = 65536;
constexpr std::uint64_t kLongPlay = 1'000'000'000;

// A script that plays its waveform for ever, up to a limit.
class Player {
 public:
  explicit Player(std::uint64_t limit, std::uint64_t waveformSamples = kWaveformSamples) {
    options_.script = folder_.write("s.kts", "script s repeat forever generate w end repeat end script");
    options_.waveforms.given = {"w=noise:length=" + std::to_string(waveformSamples)};
    options_.window.limit = std::to_string(limit);
    loaded_ = tools::cli::loadScript(options_.script, options_.waveforms, options_.generator,
                                     options_.generator.memorySamples());
    require(loaded_ != nullptr && tools::cli::buildPrograms(*loaded_), "a script that plays");
  }

  std::string path() const { return folder_.path("play.wav"); }
  std::vector<std::int16_t> waveform() const {
    const tools::SampleBuffer& samples = loaded_->waveforms.front().waveform.samples;
    std::vector<std::int16_t> copy(samples.size());
    for (std::size_t i = 0; i < copy.size(); ++i) copy[i] = static_cast<std::int16_t>(samples[i]);
    return copy;
  }

  void simulate() {
    const ComputedPlay expected(options_.window, options_.generator, *loaded_, loaded_->programs.front());
    tools::Outputs outputs({{path(), ""}});
    outputs.open(expected.header());
    tools::cli::SimulatedPlay(options_.generator, *loaded_, expected).perform(outputs);
    outputs.finish();
  }
  void compute() {
    const ComputedPlay play(options_.window, options_.generator, *loaded_, loaded_->programs.front());
    tools::Outputs outputs({{path(), ""}});
    outputs.open(play.header());
    play.perform(outputs, [](double) {});
    outputs.finish();
  }

 private:
  TemporaryFolder folder_;
  PlayOptions options_;
  std::unique_ptr<LoadedScript> loaded_;
};

void play(benchmark::State& state, void (Player::*way)(), std::uint64_t waveformSamples) {
  const auto samples = static_cast<std::uint64_t>(state.range(0));
  Player player(samples, waveformSamples);
  for (auto _ : state) (player.*way)();
  require(readFile(player.path()).size() == 44 + 2 * samples, "all samples in the file");
  state.SetItemsProcessed(state.iterations() * state.range(0));
}

void writeAlone(benchmark::State& state) {
  const auto samples = static_cast<std::uint64_t>(state.range(0));
  const Player player(samples);
  const TemporaryFolder folder;
  const std::vector<std::int16_t> waveform = player.waveform();
  for (auto _ : state) {
    SF_INFO info{};
    info.samplerate = 1'000'000;
    info.channels = 1;
    info.format = SF_FORMAT_WAV | SF_FORMAT_PCM_16;
    SNDFILE* const file = sf_open(folder.path("alone.wav").c_str(), SFM_WRITE, &info);
    for (std::uint64_t first = 0; first < samples; first += kSamplesPerWrite) {
      const auto count = static_cast<sf_count_t>(std::min<std::uint64_t>(kSamplesPerWrite, samples - first));
      require(sf_write_short(file, waveform.data() + first % kWaveformSamples, count) == count, "a write");
    }
    sf_close(file);
  }
  state.SetItemsProcessed(state.iterations() * state.range(0));
}

void sizes(benchmark::internal::Benchmark* benchmark) {
  benchmark->Arg(1 << 20)->Arg(1 << 24)->Arg(1 << 28)->Unit(benchmark::kMillisecond);
}

BENCHMARK(writeAlone)->Name("play_to_wav/libsndfile")->Apply(sizes);
BENCHMARK_CAPTURE(play, simulated, &Player::simulate, kWaveformSamples)->Name("play_to_wav/simulated")->Apply(sizes);
BENCHMARK_CAPTURE(play, computed, &Player::compute, kWaveformSamples)->Name("play_to_wav/computed")->Apply(sizes);
BENCHMARK_CAPTURE(play, simulated_64, &Player::simulate, 64)->Name("play_to_wav_64/simulated")->Apply(sizes);
BENCHMARK_CAPTURE(play, computed_64, &Player::compute, 64)->Name("play_to_wav_64/computed")->Apply(sizes);

void measureMemory(benchmark::State& state) {
  Player player(kLongPlay);
  ProcessCost cost;
  for (auto _ : state) cost = costInNewProcess([&player] { player.simulate(); });
  require(cost.bytes >= 0, "a play in a process of its own");
  state.counters["resident_bytes"] = static_cast<double>(cost.bytes);
}
BENCHMARK(measureMemory)->Name("play_memory/simulated")->Iterations(1);

}  // namespace
