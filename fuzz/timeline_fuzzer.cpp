// What a timeline computes against what the simulated sequencer plays. The first bytes of an input raise triggers, two
// of them each up to a zero; the rest is a script of the waveforms a and b.
#include <algorithm>
#include <numeric>
#include <stdexcept>

#include "testing/TimelineScene.h"
#include "testing/require.h"
#include "tools/timeline/LevelRanges.h"

namespace {

constexpr std::uint32_t kLimit = 3000;  // samples compared

scripts::Waveforms waveforms() {
  scripts::Samples a(100);
  scripts::Samples b(333);
  std::iota(a.begin(), a.end(), 1);
  std::iota(b.begin(), b.end(), 1000);
  return {{"a", a}, {"b", b}};
}

std::vector<tools::RaisedTrigger> takeTriggers(const std::uint8_t*& data, std::size_t& size) {
  std::vector<tools::RaisedTrigger> raised;
  while (size >= 2 && data[0] != 0) {
    raised.push_back({data[1] * std::uint64_t{12}, static_cast<std::uint8_t>(data[0] % 8 + 1)});
    data += 2;
    size -= 2;
  }
  if (size > 0) {
    ++data;
    --size;
  }
  return raised;
}

void compare(const tools::Scene& scene) {
  const tools::SequencerPlay played = tools::simulate(scene, kLimit);
  const tools::Timeline& timeline = *scene.timeline;
  const std::uint64_t count = played.levels.size();
  tools::SampleBuffer samples(scene.generator.sampleWidthBits);
  samples.resize(kLimit);
  std::vector<std::uint8_t> markers(kLimit);
  const tools::Renderer renderer(timeline, scene.sources, scene.generator.sampleWidthBits);
  require(renderer.render(0, kLimit, samples.data(), markers.data()) == count, "length");
  markers.resize(count);
  require(markers == played.markers, "markers");
  for (std::uint64_t sample = 0; sample < count; ++sample) {
    require(samples[sample] == played.levels[sample], "levels");
  }
  tools::RunCursor cursor(timeline, 0);
  for (const tools::TracedRun& run : played.runs) {
    require(run.firstSample == cursor.run().firstSample && run.pass == cursor.run().pass, "runs");
    cursor.next();
  }
  const tools::LevelRanges ranges(timeline, scene.sources, scene.generator.sampleWidthBits);
  const auto [low, high] = std::ranges::minmax(played.levels);
  require(ranges.over(0, count) == tools::LevelRange{low, high}, "range of levels");
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::vector<tools::RaisedTrigger> raised = takeTriggers(data, size);
  const std::string text(reinterpret_cast<const char*>(data), size);
  try {
    const tools::Scene scene(text, waveforms(), {.memorySizeBytes = 1u << 12, .minFetchSamples = 16}, raised);
    compare(scene);
  } catch (const std::runtime_error&) {
    return -1;  // no script that builds
  }
  return 0;
}
