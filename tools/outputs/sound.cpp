#include <sndfile.h>

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <memory>

#include "tools/outputs/formats.h"
#include "tools/text/Refusal.h"
#include "tools/text/quantities.h"

namespace tools {
namespace {

constexpr double kMaxFlacRateHz = 655350;
constexpr double kMaxWavRateHz = 2147483647;
constexpr std::uint64_t kMaxWavBytes = 0xFFFF0000;  // beyond, the 64-bit form of the format is written

OutputFile& fileOf(void* user) { return *static_cast<OutputFile*>(user); }
std::FILE* streamOf(void* user) { return fileOf(user).stream(); }

sf_count_t tell(void* user) { return std::ftell(streamOf(user)); }
sf_count_t seek(sf_count_t offset, int whence, void* user) {
  if (std::fseek(streamOf(user), static_cast<long>(offset), whence) == 0) return tell(user);
  fileOf(user).noteError();  // of the write that goes before
  return -1;
}
sf_count_t length(void* user) {
  const sf_count_t position = tell(user);
  const sf_count_t end = seek(0, SEEK_END, user);
  seek(position, SEEK_SET, user);
  return end;
}
sf_count_t read(void* bytes, sf_count_t count, void* user) {
  return static_cast<sf_count_t>(std::fread(bytes, 1, static_cast<std::size_t>(count), streamOf(user)));
}
sf_count_t write(const void* bytes, sf_count_t count, void* user) {
  const std::size_t written = std::fwrite(bytes, 1, static_cast<std::size_t>(count), streamOf(user));
  if (static_cast<sf_count_t>(written) != count) fileOf(user).noteError();
  return static_cast<sf_count_t>(written);
}

SF_VIRTUAL_IO kFileAccess = {length, seek, read, write, tell};

int formatFlags(SoundFormat format, const SampleBuffer& samples) {
  const int width = samples.widthBits() == 16 ? SF_FORMAT_PCM_16 : SF_FORMAT_PCM_32;
  if (format == SoundFormat::kFlac) return SF_FORMAT_FLAC | width;
  return (samples.size() * samples.widthBits() / 8 > kMaxWavBytes ? SF_FORMAT_RF64 : SF_FORMAT_WAV) | width;
}

sf_count_t writeItems(SNDFILE* file, const std::int16_t* samples, sf_count_t count) {
  return sf_write_short(file, samples, count);
}
sf_count_t writeItems(SNDFILE* file, const std::int32_t* samples, sf_count_t count) {
  return sf_write_int(file, samples, count);
}

// The system's reason where there is one: the library's own is "no error" for a full disk.
[[noreturn]] void fail(OutputFile& file, SNDFILE* sound) {
  if (file.hasError()) file.fail();
  throw Refusal(file.path() + ": cannot be written: " + sf_strerror(sound));
}

template <typename Samples>
void writeSamples(OutputFile& file, SNDFILE* sound, const Samples& samples, const Progress& progress) {
  for (std::size_t first = 0; first < samples.size(); first += kSamplesPerStep) {
    progress(static_cast<double>(first) / static_cast<double>(samples.size()));
    const auto count = static_cast<sf_count_t>(std::min(kSamplesPerStep, samples.size() - first));
    if (writeItems(sound, samples.data() + first, count) != count) fail(file, sound);
  }
}

}  // namespace

void checkSound(const std::string& path, SoundFormat format, unsigned sampleWidthBits, double sampleRateHz) {
  if (format == SoundFormat::kFlac && sampleWidthBits > 16) {
    throw Refusal(path + ": this format holds no " + std::to_string(sampleWidthBits) + "-bit samples", "Use .wav.");
  }
  const double maxRateHz = format == SoundFormat::kFlac ? kMaxFlacRateHz : kMaxWavRateHz;
  if (sampleRateHz > maxRateHz) {
    throw Refusal(path + ": this format holds at most " + formatQuantity(maxRateHz, "S/s"), "Use .npy or .csv.");
  }
}

void writeSound(OutputFile& file, SoundFormat format, const Recording& recording, const Progress& progress) {
  SF_INFO info{};
  info.samplerate = static_cast<int>(std::max(1L, std::lround(recording.sampleRateHz)));
  info.channels = 1;
  info.format = formatFlags(format, recording.samples);
  std::unique_ptr<SNDFILE, decltype(&sf_close)> sound(sf_open_virtual(&kFileAccess, SFM_WRITE, &info, &file),
                                                      &sf_close);
  if (!sound) fail(file, nullptr);
  recording.samples.visit([&](const auto& samples) { writeSamples(file, sound.get(), samples, progress); });
  if (sf_close(sound.release()) != 0 || file.hasError()) fail(file, nullptr);
}

}  // namespace tools
