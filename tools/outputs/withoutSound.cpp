// What stands for sound in a build without libsndfile: WAV in its plainest form, and nothing else.
#include <algorithm>
#include <cmath>
#include <limits>

#include "tools/outputs/formats.h"
#include "tools/text/Refusal.h"
#include "tools/text/quantities.h"

namespace tools {
namespace {

constexpr double kMaxRateHz = std::numeric_limits<std::int32_t>::max();
constexpr std::uint64_t kHeaderBytes = 44;
constexpr std::uint64_t kMaxBytes = std::numeric_limits<std::uint32_t>::max();

// Little-endian numbers and names, one behind the other.
class Header {
 public:
  Header& name(std::string_view text) {
    bytes_ += text;
    return *this;
  }
  Header& number(std::uint64_t value, unsigned bytes) {
    for (unsigned i = 0; i < bytes; ++i) bytes_ += static_cast<char>(value >> (8 * i) & 0xFF);
    return *this;
  }
  const std::string& bytes() const { return bytes_; }

 private:
  std::string bytes_;
};

std::string describe(unsigned widthBits, std::uint64_t rateHz, std::uint64_t sampleBytes) {
  constexpr unsigned kIntegers = 1;
  constexpr unsigned kChannels = 1;
  constexpr unsigned kFormatBytes = 16;
  const unsigned bytes = widthBits / 8;
  Header header;
  header.name("RIFF").number(kHeaderBytes - 8 + sampleBytes, 4).name("WAVE");
  header.name("fmt ").number(kFormatBytes, 4).number(kIntegers, 2).number(kChannels, 2);
  header.number(rateHz, 4).number(rateHz * bytes, 4).number(bytes, 2).number(widthBits, 2);
  header.name("data").number(sampleBytes, 4);
  return header.bytes();
}

}  // namespace

void checkSound(const std::string& path, SoundFormat format, unsigned, double sampleRateHz) {
  if (format != SoundFormat::kWav) {
    throw Refusal(path + ": this build writes no such sound: it was made without libsndfile", "Use .wav.");
  }
  if (sampleRateHz > kMaxRateHz) {
    throw Refusal(path + ": this format holds at most " + formatQuantity(kMaxRateHz, "S/s"), "Use .npy or .csv.");
  }
}

SizeBounds boundSound(SoundFormat, const RecordingHeader& header) {
  const std::uint64_t bytes = saturatedBytes(header.bytesPerSample(), header.sampleCount, kHeaderBytes);
  return {bytes, bytes};
}

std::unique_ptr<OutputWriter> writeSound(ByteTarget& target, SoundFormat, const RecordingHeader& header) {
  const std::uint64_t bytes = saturatedBytes(header.bytesPerSample(), header.sampleCount, 0);
  if (bytes > kMaxBytes - kHeaderBytes) throw Refusal(target.path() + ": 4 GiB is all that it holds", "Use .npy.");
  const auto rateHz = static_cast<std::uint64_t>(std::max(1L, std::lround(header.sampleRateHz)));
  return writeSamplesBehind(describe(header.sampleWidthBits, rateHz, bytes), target);
}

}  // namespace tools
