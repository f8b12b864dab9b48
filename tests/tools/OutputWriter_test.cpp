// Outputs as they are written, into memory or nowhere.
#include <gmock/gmock.h>

#include <cstdio>
#include <cstring>

#include "tools/outputs/VcdClock.h"
#include "tools/outputs/formats.h"
#include "tools/text/Refusal.h"

namespace tools {
namespace {

using testing::AllOf;
using testing::Ge;
using testing::Le;
using testing::StartsWith;

// Keeps the first bytes and counts all, so that files of any length can be written.
class CountingTarget : public ByteTarget {
 public:
  explicit CountingTarget(std::size_t kept = 1 << 20) : bytes_(kept, '\0') {}

  const std::string& path() const override { return path_; }
  std::size_t tryWrite(const void* bytes, std::size_t count) override {
    const auto at = static_cast<std::size_t>(position_);
    if (at < bytes_.size()) std::memcpy(bytes_.data() + at, bytes, std::min(count, bytes_.size() - at));
    position_ += static_cast<std::int64_t>(count);
    size_ = std::max(size_, position_);
    return count;
  }
  std::int64_t trySeek(std::int64_t offset, int whence) override {
    position_ = offset + (whence == SEEK_SET ? 0 : whence == SEEK_CUR ? position_ : size_);
    return position_;
  }
  bool hasFailed() const override { return false; }
  void fail() override { throw Refusal("cannot fail"); }

  std::uint64_t size() const { return static_cast<std::uint64_t>(size_); }
  std::string bytes() const { return bytes_.substr(0, size()); }
  std::uint64_t number(std::size_t at, int byteCount) const {
    std::uint64_t value = 0;
    for (int i = byteCount; i-- > 0;)
      value = value << 8 | static_cast<unsigned char>(bytes_[at + static_cast<std::size_t>(i)]);
    return value;
  }

 private:
  std::string path_ = "target";
  std::string bytes_;
  std::int64_t position_ = 0;
  std::int64_t size_ = 0;
};

using Open = std::unique_ptr<OutputWriter> (*)(ByteTarget&, const RecordingHeader&);
struct NamedFormat {
  const char* name;
  Open open;
  SizeBounds (*bound)(const RecordingHeader&);
};
template <SoundFormat format>
constexpr NamedFormat soundAs(const char* name) {
  return {name, [](ByteTarget& target, const RecordingHeader& header) { return writeSound(target, format, header); },
          [](const RecordingHeader& header) { return boundSound(format, header); }};
}
const NamedFormat kFormats[] = {soundAs<SoundFormat::kWav>("wav"),
                                soundAs<SoundFormat::kFlac>("flac"),
                                {"csv", writeCsv, boundCsv},
                                {"npy", writeNpy, boundNpy},
                                {"vcd", writeVcd, boundVcd},
                                {"png",
                                 [](ByteTarget& target, const RecordingHeader& header) {
                                   return writePicture(target, PictureFormat::kPng, header);
                                 },
                                 nullptr}};

bool isBuilt(std::string_view name) {
  return (name != "flac" || KTORBA_WITH_SOUND) && (name != "png" || KTORBA_WITH_PICTURES);
}

// A play of every kind of thing, by what its header says.
struct Example {
  RecordingHeader header;
  std::vector<std::int16_t> samples;
  std::vector<MarkerEvent> markers;
  std::vector<SegmentStart> segments;

  Example(std::uint64_t firstSample, std::size_t count) {
    header.title = "example";
    header.sampleRateHz = 44100;
    header.firstSample = firstSample;
    header.sampleCount = count;
    header.markerMask = 0b1001;
    header.triggers = {{firstSample + 1, 2}, {firstSample + count / 2, 3}};
    header.program = {{SegmentKind::kWaitForTrigger, "", 0, 0, 0}, {SegmentKind::kWaveform, "w", 123, 5, 1}};
    for (std::size_t i = 0; i < count; ++i) {
      samples.push_back(static_cast<std::int16_t>(i % 5 == 0 ? -32768 : i * 7919));
      if (i % 31 == 0) markers.push_back({firstSample + i, static_cast<std::uint8_t>(i % 2 == 0 ? 1 : 0b1001)});
      if (i % 97 == 0) segments.push_back({firstSample + i, static_cast<std::uint32_t>(i % 2)});
    }
  }

  // In blocks of that many samples.
  void write(OutputWriter& writer, std::size_t blockSize) const {
    for (std::size_t first = 0; first < samples.size(); first += blockSize) {
      const std::uint64_t begin = header.firstSample + first;
      const auto part = std::span(samples).subspan(first, std::min(blockSize, samples.size() - first));
      writer.take({begin, part, within(markers, begin, part.size()), within(segments, begin, part.size())});
    }
    writer.finish();
  }
  template <typename Event>
  static std::span<const Event> within(const std::vector<Event>& events, std::uint64_t begin, std::size_t count) {
    const auto first = std::ranges::lower_bound(events, begin, {}, &Event::sample);
    return {first, std::ranges::lower_bound(events, begin + count, {}, &Event::sample)};
  }
};

TEST(OutputWriter, WritesTheSameHoweverThePlayIsCut) {
  for (const std::uint64_t firstSample : {std::uint64_t{0}, std::uint64_t{123'456'789'012}}) {
    const Example example(firstSample, 5000);
    for (const auto& [name, open, bound] : kFormats) {
      if (!isBuilt(name)) continue;
      CountingTarget whole;
      example.write(*open(whole, example.header), 5000);
      for (const std::size_t blockSize : {1, 96, 4999}) {
        CountingTarget cut;
        example.write(*open(cut, example.header), blockSize);
        EXPECT_EQ(cut.bytes(), whole.bytes()) << name << " in blocks of " << blockSize;
      }
      if (bound == nullptr) continue;
      const SizeBounds bounds = bound(example.header);
      EXPECT_THAT(whole.size(), AllOf(Ge(bounds.least), Le(bounds.greatest))) << name;
    }
  }
}

TEST(OutputWriter, BoundsSizesOfAnyLength) {
  Example example(0, 1);
  example.header.sampleCount = UINT64_MAX / 2;
  for (const auto& [name, open, bound] : kFormats) {
    if (bound == nullptr) continue;
    EXPECT_EQ(bound(example.header).greatest, UINT64_MAX) << name;
  }
  EXPECT_EQ(boundCsv(Example(8, 4).header).least + 2, boundCsv(Example(9, 4).header).least + 1);  // 8 becomes 12
}

std::uint64_t writeZeros(CountingTarget& target, std::uint64_t count, unsigned widthBits) {
  RecordingHeader header;
  header.sampleWidthBits = widthBits;
  header.sampleCount = count;
  const auto writer = writeSound(target, SoundFormat::kWav, header);
  const std::vector<std::int16_t> narrow(1 << 20);
  const std::vector<std::int32_t> wide(1 << 20);
  for (std::uint64_t done = 0; done < count;) {
    const auto part = static_cast<std::size_t>(std::min<std::uint64_t>(narrow.size(), count - done));
    writer->take({done,
                  widthBits == 16 ? SampleSpan(std::span(narrow).first(part)) : SampleSpan(std::span(wide).first(part)),
                  {},
                  {}});
    done += part;
  }
  writer->finish();
  return boundSound(SoundFormat::kWav, header).least;
}

// The lengths in the file, and the file itself, hold what was written on both sides of 4 GiB.
TEST(OutputWriter, SoundsBeyond4GiBHaveLengthsOf64Bits) {
  constexpr std::uint64_t kMostNarrow = 0xFFFF0000 / 2;
  for (const std::uint64_t count : {std::uint64_t{1}, kMostNarrow}) {
    CountingTarget wav(128);
    const std::uint64_t announced = writeZeros(wav, count, 16);
    EXPECT_EQ(announced, wav.size());
    EXPECT_THAT(wav.bytes(), StartsWith("RIFF"));
    EXPECT_EQ(wav.number(4, 4), wav.size() - 8);
    EXPECT_EQ(wav.number(40, 4), 2 * count);
  }
  for (const auto& [count, width] : {std::pair(kMostNarrow + 1, 16u), std::pair(kMostNarrow, 32u)}) {
    CountingTarget rf64(128);
    const std::uint64_t announced = writeZeros(rf64, count, width);
    EXPECT_EQ(announced, rf64.size());
    EXPECT_THAT(rf64.bytes(), StartsWith("RF64\xFF\xFF\xFF\xFFWAVEds64"));
    EXPECT_EQ(rf64.number(20, 8), rf64.size() - 8);
    EXPECT_EQ(rf64.number(28, 8), count * width / 8);
    EXPECT_EQ(rf64.number(36, 8), count);
  }
}

TEST(OutputWriter, RefusesWhatAFormatCannotCount) {
  RecordingHeader header;
  header.sampleCount = std::uint64_t{1} << 36;
  CountingTarget target;
  EXPECT_THROW(writeSound(target, SoundFormat::kFlac, header), Refusal);
  header.sampleRateHz = 1.28e9;
  header.sampleCount = 1'000'000'000'000;
  EXPECT_NO_THROW(writeVcd(target, header));
  header.sampleCount = 118'059'162'071'742;  // times 78 125 is beyond 2^63
  EXPECT_THROW(writeVcd(target, header), Refusal);
  --header.sampleCount;
  EXPECT_NO_THROW(writeVcd(target, header));
}

TEST(VcdClock, CountsInWholeNumbers) {
  struct Case {
    double rateHz;
    const char* unit;
    std::uint64_t sample;
    std::uint64_t ticks;
  };
  const Case cases[] = {
      {1, "1 s", 1'000'000'000'000'000'000, 1'000'000'000'000'000'000},
      {0.1, "1 s", 3, 30},
      {0.4, "100 ms", 3, 75},
      {1e-3, "1 s", 3, 3000},
      {1e6, "1 us", 7, 7},
      {1.25e8, "1 ns", 999'999'999'999'999, 7'999'999'999'999'992},
      {1.28e9, "10 fs", 1'000'000'000'001, 78'125'000'000'078'125},
      {1e12, "1 ps", 9'007'199'254'740'991, 9'007'199'254'740'991},
      {44100, "1 ps", 44100, 1'000'000'000'000},  // rounded, but never by more than half a unit
      {44100, "1 ps", 1, 22'675'737},
      {44100, "1 ps", 1'500'295, 34'020'294'784'580},
      {3e11, "1 ps", 2'000'000'000'000, 6'666'666'666'667},
      {0.012345678901234567, "1 ps", 1, 81'000'000'729'000},
  };
  for (const auto& [rateHz, unit, sample, ticks] : cases) {
    const VcdClock clock(rateHz, sample, "");
    EXPECT_EQ(clock.unit(), unit) << rateHz;
    EXPECT_EQ(clock.ticks(sample), ticks) << rateHz << " " << sample;
  }
}

}  // namespace
}  // namespace tools
