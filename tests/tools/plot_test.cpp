// What pictures show of timelines against what they show of the same, recorded.
#include <gmock/gmock.h>

#include "testing/TimelineScene.h"
#include "tools/outputs/picture/RecordedView.h"
#include "tools/plot/TimelineView.h"
#include "tools/plot/summariseLane.h"
#include "tools/timeline/BlockRenderer.h"

namespace tools {
namespace {

constexpr std::uint64_t kLongest = 20'000;  // samples of a window

// Neighbouring pieces of a waveform count as one fetch.
std::vector<PlayedInstruction> instructionsOf(const StraightPlay& play, std::size_t words) {
  std::vector<PlayedInstruction> program(words);
  for (std::uint32_t address = 0; address < words; ++address) program[address].firstOfFetch = address;
  const Step* last = nullptr;
  for (const Block& block : play.blocks()) {
    for (std::uint32_t index = block.firstStep; index < block.endStep; ++index) {
      const Step& step = play.steps()[index];
      PlayedInstruction& played = program[step.address];
      played.kind = static_cast<SegmentKind>(step.kind);
      if (step.waveform != Step::kNone) played.name = play.waveforms()[step.waveform];
      const bool isPiece = index > block.firstStep && step.waveform != Step::kNone && step.waveform == last->waveform &&
                           step.firstInWaveform == last->firstInWaveform + last->sampleCount;
      if (isPiece) played.firstOfFetch = program[last->address].firstOfFetch;
      last = &step;
    }
  }
  return program;
}

RecordingHeader randomWindow(const Scene& scene, Random& random) {
  const Timeline& timeline = *scene.timeline;
  const std::uint64_t length = std::min(timeline.sampleCount(), kLongest);
  RecordingHeader header;
  header.sampleWidthBits = scene.generator.sampleWidthBits;
  header.firstSample = pick(random, 0, static_cast<std::uint32_t>(length - 1));
  header.sampleCount = pick(random, 1, static_cast<std::uint32_t>(length - header.firstSample));
  header.program = instructionsOf(timeline.play(), scene.words.size());
  for (unsigned marker = 0; marker < ktorba::kMarkerCount; ++marker) {
    const bool fires = timeline.markerCount(marker, header.firstSample, header.endSample()) != 0;
    if (fires) header.markerMask |= ktorba::markerBitOf(marker);
  }
  return header;
}

RecordedView record(const Scene& scene, const RecordingHeader& header, const PictureScale& scale, Random& random) {
  constexpr RecordingParts kAll = {.samples = true, .markers = true, .segments = true};
  BlockRenderer renderer(*scene.timeline, scene.sources, header.sampleWidthBits, kAll, header.firstSample);
  RecordedView view(header, scale);
  for (std::uint64_t left = header.sampleCount; left > 0;) {
    const std::uint64_t count = pick(random, 1, static_cast<std::uint32_t>(left));
    view.take(renderer.next(count));
    left -= count;
  }
  view.finish();
  return view;
}

std::string describe(const LaneItem& item) { return std::to_string(static_cast<int>(item.kind)) + item.name; }

// Whatever the order of the items.
void expectSame(const Lane& lane, const Lane& expected) {
  ASSERT_EQ(lane.blocks.size(), expected.blocks.size());
  for (std::size_t i = 0; i < lane.blocks.size(); ++i) {
    EXPECT_NEAR(lane.blocks[i].first, expected.blocks[i].first, 1e-6);
    EXPECT_NEAR(lane.blocks[i].last, expected.blocks[i].last, 1e-6);
    EXPECT_EQ(lane.blocks[i].playCount, expected.blocks[i].playCount);
    EXPECT_EQ(describe(lane.items[lane.blocks[i].item]), describe(expected.items[expected.blocks[i].item]));
  }
  ASSERT_EQ(lane.mixtures.size(), expected.mixtures.size());
  for (std::size_t i = 0; i < lane.mixtures.size(); ++i) {
    EXPECT_EQ(lane.mixtures[i].firstColumn, expected.mixtures[i].firstColumn);
    EXPECT_EQ(lane.mixtures[i].segmentCount, expected.mixtures[i].segmentCount);
    ASSERT_EQ(lane.mixtures[i].shares.size(), expected.mixtures[i].shares.size());
    for (std::size_t column = 0; column < lane.mixtures[i].shares.size(); ++column) {
      std::map<std::string, double> difference;
      for (std::size_t item = 0; item < lane.items.size(); ++item) {
        difference[describe(lane.items[item])] += lane.mixtures[i].shares[column][item];
      }
      for (std::size_t item = 0; item < expected.items.size(); ++item) {
        difference[describe(expected.items[item])] -= expected.mixtures[i].shares[column][item];
      }
      // Columns begin at whole samples.
      for (const auto& [item, by] : difference) EXPECT_NEAR(by, 0, 0.1) << item;
    }
  }
}

TEST(TimelineView, ShowsWhatARecordingShows) {
  forEachSeed(1'500, [](Random& random) {
    const GeneratorOptions generator = randomGenerator(random);
    const scripts::Waveforms waveforms =
        scripts::randomWaveforms(random, generator.minFetchSamples, 1000, generator.sampleWidthBits);
    std::vector<RaisedTrigger> raised;
    for (std::uint32_t left = pick(random, 0, 12); left > 0; --left) {
      raised.push_back({pick(random, 0, kLongest), static_cast<std::uint8_t>(pick(random, 2, 8))});
    }
    const std::string text = scripts::randomScript(random, waveforms, generator.minFetchSamples);
    const Scene scene(text, waveforms, generator, raised);
    const RecordingHeader header = randomWindow(scene, random);
    SCOPED_TRACE(text + std::to_string(header.firstSample) + " " + std::to_string(header.sampleCount));
    const PictureScale scale = {pick(random, 1, 300), pick(random, 4, 150), pick(random, 1, 600)};
    const RecordedView recorded = record(scene, header, scale, random);
    const TimelineView computed(header, *scene.timeline, scene.sources, scale);
    const auto flat = [](const Levels& levels) {
      std::vector<std::int32_t> numbers = levels.samples;
      for (const EnvelopeColumn& column : levels.columns)
        numbers.insert(numbers.end(), {column.least, column.greatest});
      numbers.insert(numbers.end(), {levels.extremes.least, levels.extremes.greatest});
      return numbers;
    };
    EXPECT_EQ(flat(computed.levels()), flat(recorded.levels()));
    for (const unsigned marker : usedMarkers(header)) {
      EXPECT_EQ(computed.pulses(marker).count, recorded.pulses(marker).count);
      EXPECT_EQ(computed.pulses(marker).samples, recorded.pulses(marker).samples);
    }
    expectSame(computed.playing(), recorded.playing());
    if (header.sampleCount < 20 * scale.laneColumns) return;  // boundaries of columns are coarse
    expectSame(summariseLane(header, *scene.timeline, scale.laneColumns, 0), recorded.playing());
  });
}

}  // namespace
}  // namespace tools
