#include "cli/outputs/Output.h"

#include <gmock/gmock.h>

#include <cmath>

#include "cli/outputs/picture/Axis.h"
#include "cli/outputs/picture/Envelope.h"
#include "cli/outputs/picture/Lane.h"
#include "cli/sources/Source.h"
#include "cli/temporary.h"

namespace cli {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::StartsWith;

// Ten samples: a wait of 2, the waveform "w" of 5 with markers, and a wait for trigger3 of 3.
Recording makeRecording(unsigned widthBits) {
  Recording recording;
  recording.title = "ten samples, \xFF in the title";
  recording.sampleRateHz = 44100;
  recording.samples = SampleBuffer(widthBits);
  for (const int value : {0, 0, 1, -1, 32767, -32768, 5, 5, 5, 5}) recording.samples.push(value);
  recording.markers = {{0, 0x80}, {4, 0x81}};
  recording.triggers = {{8, 3}};
  recording.program = {{SegmentKind::kWait, "", 1, 1},
                       {SegmentKind::kWaveform, "w", 2, 5},
                       {SegmentKind::kWaitForTrigger, "trigger3", 3, 1}};
  recording.segments = {{0, 2, 0}, {2, 5, 1}, {7, 3, 2}};
  return recording;
}

TEST(Output, SoundCsvAndRawReadBackAsTheSamples) {
  const TemporaryFolder folder;
  for (const unsigned width : {16u, 32u}) {
    const Recording recording = makeRecording(width);
    const SourceFormat format = {width, 44100, 100};
    for (const char* name : {"a.wav", "a.flac", "a.csv"}) {
      if (width == 32 && name == std::string("a.flac")) continue;
      const std::string path = folder.path(name);
      checkOutput(path, width, 44100);
      writeOutput(path, recording);
      const std::string source = name == std::string("a.csv") ? path + ":value,codes" : path;
      const LoadedWaveform loaded = loadSource(source, format);
      EXPECT_EQ(loaded.samples, recording.samples) << name << width;
      EXPECT_EQ(loaded.recordedRateHz, name == std::string("a.csv") ? 0 : 44100);
    }
  }
}

TEST(Output, ArraysHaveAnAlignedHeaderAndLittleEndianSamples) {
  const TemporaryFolder folder;
  writeOutput(folder.path("a.npy"), makeRecording(32));
  const std::string text = folder.read("a.npy");
  const std::size_t headerLength =
      10 + static_cast<unsigned char>(text[8]) + 256u * static_cast<unsigned char>(text[9]);
  EXPECT_THAT(text, StartsWith(std::string("\x93NUMPY\x01\x00", 8)));
  EXPECT_THAT(text, HasSubstr("{'descr': '<i4', 'fortran_order': False, 'shape': (10,), }"));
  EXPECT_EQ(headerLength % 64, 0u);
  ASSERT_EQ(text.size(), headerLength + 40);
  EXPECT_EQ(text.substr(headerLength + 20, 4), std::string("\x00\x80\xFF\xFF", 4));
}

TEST(Output, PicturesAreWholeFiles) {
  const TemporaryFolder folder;
  const std::pair<const char*, std::string> cases[] = {{"a.svg", "<?xml"}, {"a.png", "\x89PNG"}, {"a.pdf", "%PDF"}};
  for (const auto& [name, magic] : cases) {
    writeOutput(folder.path(name), makeRecording(16));
    EXPECT_THAT(folder.read(name), StartsWith(magic));
  }
  EXPECT_THAT(folder.read("a.svg"), HasSubstr("</svg>"));
  EXPECT_EQ(folder.list(), "a.pdf a.png a.svg ");
}

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
  Recording recording = makeRecording(16);
  recording.segments.clear();
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
  recording.samples = SampleBuffer();
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
}  // namespace cli
