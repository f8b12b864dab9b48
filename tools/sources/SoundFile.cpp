#include "tools/sources/SoundFile.h"

#include <sndfile.h>

#include <memory>

#include "tools/sources/SampleScaler.h"
#include "tools/text/Refusal.h"

namespace tools {
namespace {

constexpr sf_count_t kBlockFrames = 4096;

using SoundFile = std::unique_ptr<SNDFILE, decltype(&sf_close)>;

void checkChannel(const std::string& source, int channel, int channels) {
  if (channel >= 1 && channel <= channels) return;
  throw Refusal(source + ": there is no channel " + std::to_string(channel),
                channels == 1 ? "The file has one channel." : "Channels are 1 to " + std::to_string(channels) + ".");
}

}  // namespace

LoadedWaveform loadSoundFile(const std::string& source, const std::string& path, int channel,
                             const SourceFormat& format) {
  SF_INFO info{};
  const SoundFile file(sf_open(path.c_str(), SFM_READ, &info), &sf_close);
  if (!file) {
    throw Refusal(source + ": " + sf_strerror(nullptr),
                  "Sources are sound files, .csv columns, .raw or .bin samples, and shapes such as sine:length=1000.");
  }
  checkChannel(source, channel, info.channels);
  SampleScaler scaler(source, format);
  const auto channels = static_cast<std::size_t>(info.channels);
  std::vector<double> block(static_cast<std::size_t>(kBlockFrames) * channels);
  while (const sf_count_t frames = sf_readf_double(file.get(), block.data(), kBlockFrames)) {
    for (std::size_t frame = 0; frame < static_cast<std::size_t>(frames); ++frame) {
      scaler.addFraction(block[frame * channels + static_cast<std::size_t>(channel) - 1]);
    }
  }
  if (sf_error(file.get()) != SF_ERR_NO_ERROR) throw Refusal(source + ": " + sf_strerror(file.get()));
  LoadedWaveform waveform = scaler.finish();
  waveform.recordedRateHz = info.samplerate;
  return waveform;
}

bool isSoundFile(const std::string& path) {
  SF_INFO info{};
  return SoundFile(sf_open(path.c_str(), SFM_READ, &info), &sf_close) != nullptr;
}

}  // namespace tools
