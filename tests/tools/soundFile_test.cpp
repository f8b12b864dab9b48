// Sound files as sources.
#include <gmock/gmock.h>
#include <sndfile.h>

#include <cmath>

#include "testing/files.h"
#include "tests/tools/sourceOutcome.h"
#include "tools/text/Refusal.h"

namespace tools {
namespace {

using testing::HasSubstr;

template <typename Sample>
void writeSound(const std::string& path, int format, int channels, const std::vector<Sample>& samples) {
  SF_INFO info{};
  info.samplerate = 44100;
  info.channels = channels;
  info.format = format;
  SNDFILE* file = sf_open(path.c_str(), SFM_WRITE, &info);
  if constexpr (std::is_same_v<Sample, short>) sf_write_short(file, samples.data(), ssize(samples));
  if constexpr (std::is_same_v<Sample, float>) sf_write_float(file, samples.data(), ssize(samples));
  sf_close(file);
}

TEST(SoundSource, FilesGiveTheirSamplesBitForBit) {
  const TemporaryFolder folder;
  using V = std::vector<std::int32_t>;
  const std::string wav = folder.path("two.wav");
  writeSound<short>(wav, SF_FORMAT_WAV | SF_FORMAT_PCM_16, 2, {1, -1, 32767, -32768, 3, -3});
  EXPECT_EQ(load(wav), (V{1, 32767, 3}));
  EXPECT_EQ(load(wav + ":2"), (V{-1, -32768, -3}));
  EXPECT_EQ(load(wav + ":2", k32), (V{-65536, INT32_MIN, -196608}));
  EXPECT_EQ(loadSource(wav, k16).recordedRateHz, 44100);
}

TEST(SoundSource, SaysWhichChannelOfSeveralWasTaken) {
  const TemporaryFolder folder;
  const std::string wav = folder.path("two.wav");
  writeSound<short>(wav, SF_FORMAT_WAV | SF_FORMAT_PCM_16, 2, {8192, -1, -16384, 3});
  EXPECT_THAT(loadSource(wav, k16).notes, testing::ElementsAre("channel 1 of 2 taken, 2 samples, -0.5 to 0.25"));
  for (const char* chosen : {":1", ":channel=2"}) EXPECT_TRUE(loadSource(wav + chosen, k16).notes.empty()) << chosen;
}

// A sine that was recorded at another rate, against the same sine at the generator's.
TEST(SoundSource, ResamplingKeepsTheSignal) {
  const TemporaryFolder folder;
  std::vector<float> recorded(20000);
  for (std::size_t i = 0; i < recorded.size(); ++i) recorded[i] = 0.5f * std::sin(0.1f * static_cast<float>(i));
  const std::string wav = folder.path("sine.wav");
  writeSound<float>(wav, SF_FORMAT_WAV | SF_FORMAT_FLOAT, 1, recorded);
  const SourceFormat format = {16, 48000, 1u << 20};
  for (const double recordedHz : {44100.0, 1000.0, 96000.0}) {
    const std::string source = wav + ":resample,gain=2,rate=" + std::to_string(recordedHz);
    const LoadedWaveform waveform = loadSource(source, format);
    EXPECT_NEAR(static_cast<double>(waveform.samples.size()), 20000 * 48000 / recordedHz, 1);
    const auto filtered =
        static_cast<std::size_t>(300 * 48000 / recordedHz);  // at each end, where the filter is cut off
    for (std::size_t i = filtered; i + filtered < waveform.samples.size(); ++i) {
      ASSERT_NEAR(waveform.samples[i], 32768 * std::sin(0.1 * static_cast<double>(i) * recordedHz / 48000), 40) << i;
    }
  }
  const LoadedWaveform waveform = loadSource(wav + ":resample", format);
  EXPECT_THAT(waveform.notes, testing::ElementsAre(HasSubstr("44.1 kS/s to 48 kS/s: 20\u2009000 samples became 21")));
  EXPECT_EQ(loadSource(wav + ":resample,rate=48kHz", format).samples.size(), recorded.size());
  EXPECT_THAT(refusal(wav + ":resample", {16, 1e9, 100}), HasSubstr("at most 256"));
  EXPECT_THAT(refusal(wav + ":resample", {16, 48000, 20000}), HasSubstr("longer than the generator's memory"));
}

TEST(SoundSource, RefusalsOfSoundFilesNameTheFaultAndTheHelp) {
  const TemporaryFolder folder;
  const std::string stereo = folder.path("s.flac");
  writeSound<short>(stereo, SF_FORMAT_FLAC | SF_FORMAT_PCM_16, 2, {1, 2});
  const std::string nan = folder.path("nan.wav");
  writeSound<float>(nan, SF_FORMAT_WAV | SF_FORMAT_FLOAT, 1, {0, 0, NAN});
  const std::string silent = folder.path("silent.wav");
  writeSound<short>(silent, SF_FORMAT_WAV | SF_FORMAT_PCM_16, 1, {});
  const std::pair<std::string, const char*> cases[] = {
      {stereo + ":3", "there is no channel 3 / Channels are 1 to 2."},
      {stereo + ":0", "there is no channel 0"},
      {stereo + ":left", "\"left\" is not a channel number"},
      {stereo + ":1,channel=2", "the channel is given twice"},
      {stereo + ":1,codes", "codes does not go with"},
      {stereo + ":1,column=2", "there is no parameter \"column\""},
      {nan, "sample 2 is not a finite number"},
      {silent, "holds no samples"},
      {folder.write("empty.wav", ""), "empty.wav: "},
      {folder.write("text.wav", "no sound"), "Sources are sound files"},
  };
  for (const auto& [source, expected] : cases) EXPECT_THAT(refusal(source), HasSubstr(expected)) << source;
}

TEST(SoundSource, AFolderGivesItsSoundFilesByName) {
  const TemporaryFolder folder;
  writeSound<short>(folder.path("camera-shutter.wav"), SF_FORMAT_WAV | SF_FORMAT_PCM_16, 1, {1});
  writeSound<short>(folder.path("bell.aiff"), SF_FORMAT_AIFF | SF_FORMAT_PCM_16, 1, {1});
  folder.write("readme.txt", "no sound");
  const auto sources = listFolder(folder.path(""));
  ASSERT_EQ(sources.size(), 3u);
  EXPECT_TRUE(isSoundSource(sources[0].source));
  EXPECT_FALSE(isSoundSource(sources[2].source));
  EXPECT_EQ(sources[0].name, "bell");
  EXPECT_EQ(sources[1].name, "camerashutter");
  EXPECT_THROW(listFolder(folder.path("missing")), Refusal);
}

}  // namespace
}  // namespace tools
