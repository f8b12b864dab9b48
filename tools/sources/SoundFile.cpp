#include "tools/sources/SoundFile.h"

#include <sndfile.h>

#include <memory>
#include <optional>

#include "tools/sources/SampleScaler.h"

namespace tools {
namespace {

constexpr sf_count_t kBlockFrames = 4096;

using SoundFile = std::unique_ptr<SNDFILE, decltype(&sf_close)>;

void checkChannel(const Parameters& parameters, int channel, int channels) {
  if (channel >= 1 && channel <= channels) return;
  parameters.refuse(
      "there is no channel " + std::to_string(channel),
      channels == 1 ? "The file has one channel." : "Channels are 1 to " + std::to_string(channels) + ".");
}

int parseChannel(const Parameters& parameters, const std::string& text) {
  if (const auto channel = parseInteger<int>(text)) return *channel;
  parameters.refuse("\"" + text + "\" is not a channel number");
}

// Nothing: nobody chose one.
std::optional<int> readChannel(Parameters& parameters) {
  const std::string channel = parameters.choice("channel");
  if (channel.empty()) return std::nullopt;
  return parseChannel(parameters, channel);
}

Scale readSoundScale(Parameters& parameters, int fileRateHz) {
  Scale scale = readScale(parameters, fileRateHz);
  parameters.checkAllUsed();
  if (scale.areCodes) parameters.refuse("holds fractions of full scale, which codes does not go with");
  return scale;
}

}  // namespace

LoadedWaveform loadSoundFile(const std::string& path, Parameters& parameters, const SourceFormat& format) {
  SF_INFO info{};
  const SoundFile file(sf_open(path.c_str(), SFM_READ, &info), &sf_close);
  if (!file) {
    parameters.refuse(sf_strerror(nullptr),
                      "Sources are sound files, .csv or .txt columns, .npy and .npz arrays, .raw or .bin samples, and "
                      "shapes such as sine:length=1000.");
  }
  const std::optional<int> chosen = readChannel(parameters);
  const int channel = chosen.value_or(1);
  checkChannel(parameters, channel, info.channels);
  SampleScaler scaler(parameters.source(), format, readSoundScale(parameters, info.samplerate));
  const auto channels = static_cast<std::size_t>(info.channels);
  std::vector<double> block(static_cast<std::size_t>(kBlockFrames) * channels);
  while (const sf_count_t frames = sf_readf_double(file.get(), block.data(), kBlockFrames)) {
    for (std::size_t frame = 0; frame < static_cast<std::size_t>(frames); ++frame) {
      scaler.add(block[frame * channels + static_cast<std::size_t>(channel) - 1]);
    }
  }
  if (sf_error(file.get()) != SF_ERR_NO_ERROR) parameters.refuse(sf_strerror(file.get()));
  const bool isDefault = !chosen && info.channels > 1;
  return scaler.finish(isDefault ? "channel 1 of " + std::to_string(info.channels) + " taken" : "");
}

bool isSoundFile(const std::string& path) {
  SF_INFO info{};
  return SoundFile(sf_open(path.c_str(), SFM_READ, &info), &sf_close) != nullptr;
}

}  // namespace tools
