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
  EXPECT_EQ(labels(makeTimeAxis(6.664e-3, 11)), "0 1 2 3 4 5 6 ms");
  EXPECT_EQ(labels(makeTimeAxis(1e-6, 5)), "0.0 0.2 0.4 0.6 0.8 1.0 \u00b5s");
  EXPECT_EQ(labels(makeTimeAxis(250, 5)), "0 50 100 150 200 250 s");
  EXPECT_EQ(labels(makeLevelAxis(-1, 1, 7)), "\u22121.0 \u22120.5 0.0 0.5 1.0 ");
  EXPECT_EQ(labels(makeLevelAxis(0, 0, 7)), "\u22121.0 \u22120.5 0.0 0.5 1.0 ");
  EXPECT_EQ(labels(makeLevelAxis(0.001, 0.002, 7)), "0.0000 0.0005 0.0010 0.0015 0.0020 ");
}

TEST(Picture, EnvelopesJoinAndMissNoPeak) {
  SampleBuffer samples;
  for (int i = 0; i < 10; ++i) samples.push(i == 7 ? -9 : i);
  const auto envelope = makeEnvelope(samples, 3);
  ASSERT_EQ(envelope.size(), 3u);
  EXPECT_EQ(envelope[1].least, 2);  // the last sample of the column before
  EXPECT_EQ(envelope[1].greatest, 5);
  EXPECT_EQ(envelope[2].least, -9);
  EXPECT_EQ(envelope[2].greatest, 9);
}

TEST(Picture, LanesShowBlocksRepeatsAndMixtures) {
  Recording recording;
  recording.program = {{SegmentKind::kWait, "", 1, 1}, {SegmentKind::kWaveform, "w", 2, 5}};
  const auto play = [&recording](std::uint32_t address, std::uint64_t count) {
    const auto& all = recording.segments;
    recording.segments.push_back({all.empty() ? 0 : all.back().firstSample + all.back().sampleCount, count, address});
  };
  play(1, 1000);
  for (int i = 0; i < 1000; ++i) play(0, 1);
  play(1, 1000);
  for (int i = 0; i < 500; ++i) {
    play(0, 1);
    play(1, 1);
  }
  for (int i = 0; i < 4000; ++i) recording.samples.push(0);
  const Lane lane = makeLane(recording, 400);
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
