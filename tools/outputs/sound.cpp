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
constexpr std::uint64_t kMaxFlacSamples = (std::uint64_t{1} << 36) - 1;
constexpr double kMaxWavRateHz = 2147483647;
constexpr std::uint64_t kMaxWavBytes = 0xFFFF0000;  // beyond, the 64-bit form of the format is written
// What stands in front of the samples.
constexpr std::uint64_t kWavHeader = 44;
constexpr std::uint64_t kRf64Header = 104;
constexpr std::uint64_t kMostFlacHeader = 8192;

ByteTarget& targetOf(void* user) { return *static_cast<ByteTarget*>(user); }

sf_count_t tell(void* user) { return targetOf(user).trySeek(0, SEEK_CUR); }
sf_count_t seek(sf_count_t offset, int whence, void* user) { return targetOf(user).trySeek(offset, whence); }
sf_count_t length(void* user) {
  const sf_count_t position = tell(user);
  const sf_count_t end = seek(0, SEEK_END, user);
  seek(position, SEEK_SET, user);
  return end;
}
sf_count_t read(void*, sf_count_t, void*) { return 0; }  // nobody reads what is being written
sf_count_t write(const void* bytes, sf_count_t count, void* user) {
  return static_cast<sf_count_t>(targetOf(user).tryWrite(bytes, static_cast<std::size_t>(count)));
}

SF_VIRTUAL_IO kTargetAccess = {length, seek, read, write, tell};

std::uint64_t samplesBytes(const RecordingHeader& header) {
  return saturatedBytes(header.bytesPerSample(), header.sampleCount, 0);
}

bool needs64Bits(const RecordingHeader& header) { return samplesBytes(header) > kMaxWavBytes; }

int formatFlags(SoundFormat format, const RecordingHeader& header) {
  const int width = header.sampleWidthBits == 16 ? SF_FORMAT_PCM_16 : SF_FORMAT_PCM_32;
  if (format == SoundFormat::kFlac) return SF_FORMAT_FLAC | width;
  return (needs64Bits(header) ? SF_FORMAT_RF64 : SF_FORMAT_WAV) | width;
}

sf_count_t writeItems(SNDFILE* file, const std::int16_t* samples, sf_count_t count) {
  return sf_write_short(file, samples, count);
}
sf_count_t writeItems(SNDFILE* file, const std::int32_t* samples, sf_count_t count) {
  return sf_write_int(file, samples, count);
}

class SoundWriter final : public OutputWriter {
 public:
  SoundWriter(ByteTarget& target, SoundFormat format, const RecordingHeader& header) : target_(target) {
    SF_INFO info{};
    info.samplerate = static_cast<int>(std::max(1L, std::lround(header.sampleRateHz)));
    info.channels = 1;
    info.format = formatFlags(format, header);
    sound_.reset(sf_open_virtual(&kTargetAccess, SFM_WRITE, &info, &target));
    if (!sound_) fail();
  }

  void take(const RecordingBlock& block) override {
    block.samples.visit([this](const auto& samples) {
      const auto count = static_cast<sf_count_t>(samples.size());
      if (writeItems(sound_.get(), samples.data(), count) != count) fail();
    });
  }

  void finish() override {
    if (sf_close(sound_.release()) != 0 || target_.hasFailed()) fail();
  }

 private:
  // The system's reason where there is one: the library's own is "no error" for a full disk.
  [[noreturn]] void fail() {
    if (target_.hasFailed()) target_.fail();
    throw Refusal(target_.path() + ": cannot be written: " + sf_strerror(sound_.get()));
  }

  ByteTarget& target_;
  std::unique_ptr<SNDFILE, decltype(&sf_close)> sound_{nullptr, &sf_close};
};

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

SizeBounds boundSound(SoundFormat format, const RecordingHeader& header) {
  if (format == SoundFormat::kFlac) {  // what cannot be compressed grows by the frames' headers
    return {.greatest = saturatedBytes(1, samplesBytes(header), header.sampleCount / 128 + kMostFlacHeader)};
  }
  const std::uint64_t bytes = saturatedBytes(1, samplesBytes(header), needs64Bits(header) ? kRf64Header : kWavHeader);
  return {bytes, bytes};
}

std::unique_ptr<OutputWriter> writeSound(ByteTarget& target, SoundFormat format, const RecordingHeader& header) {
  if (format == SoundFormat::kFlac && header.sampleCount > kMaxFlacSamples) {
    throw Refusal(target.path() + ": this format holds at most " + formatCount(kMaxFlacSamples) + " samples",
                  "Use .wav or .npy.");
  }
  return std::make_unique<SoundWriter>(target, format, header);
}

}  // namespace tools
