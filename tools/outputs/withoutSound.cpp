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
constexpr std::uint64_t kLongHeaderBytes = 80;
constexpr std::uint64_t kMostBytes = 0xFFFF0000;  // of samples; beyond, the 64-bit form of the format is written
constexpr std::uint64_t kElsewhere = 0xFFFFFFFF;  // a length that stands in the 64-bit form's own part

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

std::uint64_t samplesBytes(const RecordingHeader& header) {
  return saturatedBytes(header.bytesPerSample(), header.sampleCount, 0);
}

bool needs64Bits(const RecordingHeader& header) { return samplesBytes(header) > kMostBytes; }

void addFormat(Header& file, const RecordingHeader& header) {
  constexpr unsigned kFormatBytes = 16;
  constexpr unsigned kIntegers = 1;
  constexpr unsigned kChannels = 1;
  const auto rateHz = static_cast<std::uint64_t>(std::max(1L, std::lround(header.sampleRateHz)));
  const unsigned bytes = header.bytesPerSample();
  file.name("fmt ").number(kFormatBytes, 4).number(kIntegers, 2).number(kChannels, 2);
  file.number(rateHz, 4).number(rateHz * bytes, 4).number(bytes, 2).number(header.sampleWidthBits, 2);
}

std::string describe(const RecordingHeader& header) {
  Header file;
  file.name("RIFF").number(kHeaderBytes - 8 + samplesBytes(header), 4).name("WAVE");
  addFormat(file, header);
  file.name("data").number(samplesBytes(header), 4);
  return file.bytes();
}

std::string describeLong(const RecordingHeader& header) {
  constexpr unsigned kLengthsBytes = 28;
  Header file;
  file.name("RF64").number(kElsewhere, 4).name("WAVE");
  file.name("ds64").number(kLengthsBytes, 4).number(kLongHeaderBytes - 8 + samplesBytes(header), 8);
  file.number(samplesBytes(header), 8).number(header.sampleCount, 8).number(0, 4);
  addFormat(file, header);
  file.name("data").number(kElsewhere, 4);
  return file.bytes();
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
  const std::uint64_t bytes =
      saturatedBytes(1, samplesBytes(header), needs64Bits(header) ? kLongHeaderBytes : kHeaderBytes);
  return {bytes, bytes};
}

std::unique_ptr<OutputWriter> writeSound(ByteTarget& target, SoundFormat format, const RecordingHeader& header) {
  checkSound(target.path(), format, header.sampleWidthBits, header.sampleRateHz);
  return writeSamplesBehind(needs64Bits(header) ? describeLong(header) : describe(header), target);
}

}  // namespace tools
