#include <gmock/gmock.h>

#include <cmath>

#include "tools/outputs/picture/Axis.h"
#include "tools/outputs/picture/Envelope.h"
#include "tools/outputs/picture/Lane.h"

namespace tools {
namespace {

using testing::ElementsAre;

std::string labels(const Axis& axis) {
  std::string text;
  for (const Tick& tick : axis.ticks) text += tick.label + " ";
  return text + axis.unit;
}

TEST(Picture, AxesHaveRoundTicks) {
  EXPECT_EQ(labels(makeTimeAxis(0, 6.664e-3, 11)), "0 1 2 3 4 5 6 ms");
  EXPECT_EQ(labels(makeTimeAxis(0, 1e-6, 5)), "0.0 0.2 0.4 0.6 0.8 1.0 \u00b5s");
  EXPECT_EQ(labels(makeTimeAxis(0, 250, 5)), "0 50 100 150 200 250 s");
  EXPECT_EQ(labels(makeTimeAxis(999.99e-3, 1000.01e-3, 4)), "0.999990 0.999995 1.000000 1.000005 1.000010 s");
  EXPECT_EQ(labels(makeLevelAxis(-1, 1, 7)), "\u22121.0 \u22120.5 0.0 0.5 1.0 ");
  EXPECT_EQ(labels(makeLevelAxis(0, 0, 7)), "\u22121.0 \u22120.5 0.0 0.5 1.0 ");
  EXPECT_EQ(labels(makeLevelAxis(0.001, 0.002, 7)), "0.0000 0.0005 0.0010 0.0015 0.0020 ");
}

TEST(Picture, EnvelopesJoinAndMissNoPeak) {
  const std::vector<std::int16_t> samples = {0, 1, 2, 3, 4, 5, 6, -9, 8, 9};
  for (const std::size_t blockSize : {1, 2, 5, 10}) {
    Envelope envelope(samples.size(), 3);
    for (std::size_t first = 0; first < samples.size(); first += blockSize) {
      envelope.take(SampleSpan(std::span(samples).subspan(first, blockSize)));
    }
    ASSERT_EQ(envelope.levels().columns.size(), 3u);
    EXPECT_EQ(envelope.levels().columns[1].least, 2);  // the last sample of the column before
    EXPECT_EQ(envelope.levels().columns[1].greatest, 5);
    EXPECT_EQ(envelope.levels().columns[2].least, -9);
    EXPECT_EQ(envelope.levels().columns[2].greatest, 9);
    EXPECT_EQ(envelope.levels().extremes.least, -9);
  }
}

TEST(Picture, LanesShowBlocksRepeatsAndMixtures) {
  RecordingHeader header;
  header.program = {{SegmentKind::kWait, "", 1, 1, 0}, {SegmentKind::kWaveform, "w", 2, 5, 1}};
  header.firstSample = 77;
  header.sampleCount = 4000;
  LaneBuilder builder(header, 400);
  std::uint64_t sample = header.firstSample;
  const auto play = [&](std::uint32_t address, std::uint64_t count) {
    builder.begin({sample, address});
    sample += count;
  };
  play(1, 1000);
  for (int i = 0; i < 1000; ++i) play(0, 1);
  play(1, 1000);
  for (int i = 0; i < 500; ++i) {
    play(0, 1);
    play(1, 1);
  }
  const Lane lane = builder.finish();
  ASSERT_EQ(lane.blocks.size(), 3u);
  EXPECT_EQ(lane.blocks[1].playCount, 1000u);
  EXPECT_EQ(lane.blocks[2].first, 200);
  ASSERT_EQ(lane.mixtures.size(), 1u);
  EXPECT_EQ(lane.mixtures[0].segmentCount, 1000u);
  EXPECT_EQ(lane.mixtures[0].firstColumn, 300u);
  ASSERT_EQ(lane.mixtures[0].shares.size(), 100u);
  EXPECT_THAT(lane.mixtures[0].shares[50], ElementsAre(testing::DoubleNear(0.5, 1e-9), testing::DoubleNear(0.5, 1e-9)));
}

}  // namespace
}  // namespace tools
