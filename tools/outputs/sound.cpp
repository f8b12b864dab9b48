#include <sndfile.h>

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

std::FILE* streamOf(void* user) { return static_cast<AtomicFile*>(user)->stream(); }

sf_count_t tell(void* user) { return std::ftell(streamOf(user)); }
sf_count_t seek(sf_count_t offset, int whence, void* user) {
  return std::fseek(streamOf(user), static_cast<long>(offset), whence) == 0 ? tell(user) : -1;
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
  return static_cast<sf_count_t>(std::fwrite(bytes, 1, static_cast<std::size_t>(count), streamOf(user)));
}

SF_VIRTUAL_IO kFileAccess = {length, seek, read, write, tell};

int formatFlags(SoundFormat format, const SampleBuffer& samples) {
  const int width = samples.widthBits() == 16 ? SF_FORMAT_PCM_16 : SF_FORMAT_PCM_32;
  if (format == SoundFormat::kFlac) return SF_FORMAT_FLAC | width;
  return (samples.size() * samples.widthBits() / 8 > kMaxWavBytes ? SF_FORMAT_RF64 : SF_FORMAT_WAV) | width;
}

sf_count_t writeItems(SNDFILE* file, const SampleBuffer::Narrow& samples) {
  return sf_write_short(file, samples.data(), ssize(samples));
}
sf_count_t writeItems(SNDFILE* file, const SampleBuffer::Wide& samples) {
  return sf_write_int(file, samples.data(), ssize(samples));
}

[[noreturn]] void fail(const AtomicFile& file, SNDFILE* sound) {
  throw Refusal(file.path() + ": cannot be written: " + sf_strerror(sound));
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

void writeSound(AtomicFile& file, SoundFormat format, const Recording& recording) {
  SF_INFO info{};
  info.samplerate = static_cast<int>(std::max(1L, std::lround(recording.sampleRateHz)));
  info.channels = 1;
  info.format = formatFlags(format, recording.samples);
  std::unique_ptr<SNDFILE, decltype(&sf_close)> sound(sf_open_virtual(&kFileAccess, SFM_WRITE, &info, &file),
                                                      &sf_close);
  if (!sound) fail(file, nullptr);
  const sf_count_t written =
      recording.samples.visit([&](const auto& samples) { return writeItems(sound.get(), samples); });
  if (static_cast<std::size_t>(written) != recording.samples.size()) fail(file, sound.get());
  if (sf_close(sound.release()) != 0) fail(file, nullptr);
}

}  // namespace tools
