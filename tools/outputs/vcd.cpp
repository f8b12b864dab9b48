#include <algorithm>
#include <array>
#include <bit>

#include "conventions/conventions.h"
#include "tools/outputs/TextWriter.h"
#include "tools/outputs/VcdClock.h"
#include "tools/outputs/formats.h"

namespace tools {
namespace {

// Identifier codes of the variables.
constexpr char kSampleCode = '!';
constexpr char kAddressCode = '"';
constexpr char kLineCode = '#';
constexpr char kLevelCode = '$';
char markerCode(unsigned marker) { return static_cast<char>('A' + marker); }
char triggerCode(unsigned trigger) { return static_cast<char>('a' + trigger - ktorba::kStartTrigger); }

class VcdWriter final : public OutputWriter {
 public:
  VcdWriter(ByteTarget& target, const RecordingHeader& header)
      : text_(target),
        header_(header),
        clock_(header.sampleRateHz, header.endSample(), target.path()),
        fullScale_(static_cast<double>(std::uint64_t{1} << (header.sampleWidthBits - 1))),
        markers_(usedMarkers(header)) {
    writeHeading();
  }

  void take(const RecordingBlock& block) override {
    marker_ = segment_ = 0;
    sample_ = block.firstSample;
    block.samples.visit([&](const auto& samples) {
      for (const auto value : samples) {
        writeSample(block, value);
        ++sample_;
      }
    });
  }

  void finish() override {
    text_ << '#' << clock_.ticks(header_.endSample()) << '\n';
    text_.flush();
  }

 private:
  void writeVariable(std::string_view type, unsigned width, char code, const std::string& name) {
    text_ << "$var " << type << ' ' << width << ' ' << code << ' ' << name << " $end\n";
  }

  void writeHeading() {
    const unsigned width = header_.sampleWidthBits;
    text_ << "$version ktorba $end\n$timescale " << clock_.unit() << " $end\n$scope module generator $end\n";
    writeVariable("wire", width, kSampleCode, "sample [" + std::to_string(width - 1) + ":0]");
    writeVariable("real", 64, kLevelCode, "level");
    for (const unsigned marker : markers_) writeVariable("wire", 1, markerCode(marker), ktorba::markerName(marker));
    for (const unsigned trigger : usedTriggers(header_)) {
      writeVariable("event", 1, triggerCode(trigger), ktorba::triggerName(trigger));
    }
    writeVariable("integer", 32, kAddressCode, "instruction");
    writeVariable("integer", 32, kLineCode, "line");
    text_ << "$upscope $end\n$enddefinitions $end\n";
  }

  bool isFirst() const { return sample_ == header_.firstSample; }

  void writeSample(const RecordingBlock& block, std::int32_t value) {
    isTimeWritten_ = false;
    writeValue(value);
    writeMarkers(block.markers);
    writeTriggers();
    writeSegments(block.segments);
  }

  void writeValue(std::int32_t value) {
    if (value == value_ && !isFirst()) return;
    value_ = value;
    writeVector(static_cast<std::uint32_t>(value), header_.sampleWidthBits, kSampleCode);
    at() << 'r' << value / fullScale_ << ' ' << kLevelCode << '\n';
  }

  void writeMarkers(std::span<const MarkerEvent> events) {
    unsigned high = 0;
    for (; marker_ < events.size() && events[marker_].sample <= sample_; ++marker_) high |= events[marker_].mask;
    if (high == high_ && !isFirst()) return;
    for (const unsigned marker : markers_) {
      const unsigned bit = ktorba::markerBitOf(marker);
      const bool isChanged = ((high ^ high_) & bit) != 0;
      if (isChanged || isFirst()) at() << ((high & bit) != 0 ? '1' : '0') << markerCode(marker) << '\n';
    }
    high_ = high;
  }

  void writeTriggers() {
    for (; trigger_ < header_.triggers.size() && header_.triggers[trigger_].sample <= sample_; ++trigger_) {
      at() << '1' << triggerCode(header_.triggers[trigger_].trigger) << '\n';
    }
  }

  void writeSegments(std::span<const SegmentStart> segments) {
    for (; segment_ < segments.size() && segments[segment_].sample <= sample_; ++segment_) {
      const std::uint32_t address = segments[segment_].address;
      writeVector(address, 32, kAddressCode);
      writeVector(header_.program[address].line, 32, kLineCode);
    }
  }

  // The low `width` bits without leading zeros.
  void writeVector(std::uint32_t bits, unsigned width, char code) {
    std::array<char, 36> line;
    const unsigned masked = width < 32 ? bits & ((1u << width) - 1) : bits;
    const int digits = std::max(1, static_cast<int>(std::bit_width(masked)));
    line[0] = 'b';
    for (int i = 0; i < digits; ++i) line[i + 1] = static_cast<char>('0' + (masked >> (digits - 1 - i) & 1));
    line[digits + 1] = ' ';
    line[digits + 2] = code;
    line[digits + 3] = '\n';
    at() << std::string_view(line.data(), digits + 4);
  }

  // The text behind the mark of the present sample's time.
  TextWriter& at() {
    if (!isTimeWritten_) text_ << '#' << clock_.ticks(sample_) << '\n';
    isTimeWritten_ = true;
    return text_;
  }

  TextWriter text_;
  const RecordingHeader& header_;
  VcdClock clock_;
  double fullScale_;
  std::vector<unsigned> markers_;  // that fire anywhere
  std::uint64_t sample_ = 0;
  std::size_t marker_ = 0;   // first event of the block not yet written
  std::size_t segment_ = 0;  // likewise
  std::size_t trigger_ = 0;  // likewise, of all
  std::int32_t value_ = 0;   // of the sample before
  unsigned high_ = 0;        // markers high at it
  bool isTimeWritten_ = false;
};

}  // namespace

// Only what changes is written: a level that is held takes nothing.
SizeBounds boundVcd(const RecordingHeader& header) {
  constexpr std::uint64_t kMostHeading = 4096;
  constexpr std::uint64_t kMostPerSample = 21 + 2 * 36 + 26;  // time, address and line, level
  const std::uint64_t flags = usedMarkers(header).size() + usedTriggers(header).size();
  const std::uint64_t perSample = kMostPerSample + header.sampleWidthBits + 4 + 3 * flags;
  return {.greatest = saturatedBytes(perSample, header.sampleCount, kMostHeading)};
}

std::unique_ptr<OutputWriter> writeVcd(ByteTarget& target, const RecordingHeader& header) {
  return std::make_unique<VcdWriter>(target, header);
}

}  // namespace tools
