// CSV and NPY.
#include <algorithm>
#include <array>
#include <limits>

#include "conventions/conventions.h"
#include "tools/outputs/TextWriter.h"
#include "tools/outputs/formats.h"

namespace tools {
namespace {

using BitOf = std::uint8_t (*)(std::uint32_t);

// One column for each of the markers or triggers that are used at all.
void writeBits(TextWriter& text, unsigned bits, const std::vector<unsigned>& used, BitOf bitOf) {
  for (const unsigned number : used) text << ((bits & bitOf(number)) != 0 ? ",1" : ",0");
}

void writeNames(TextWriter& text, const std::vector<unsigned>& used, std::string (*nameOf)(std::uint32_t)) {
  for (const unsigned number : used) text << ',' << nameOf(number);
}

// The number of the event that comes after those up to `sample`, from `next` on; `see` is called for each of these.
template <typename Event, typename See>
std::size_t passEvents(std::span<const Event> events, std::size_t next, std::uint64_t sample, See see) {
  for (; next < events.size() && events[next].sample <= sample; ++next) see(events[next]);
  return next;
}

class CsvWriter final : public OutputWriter {
 public:
  CsvWriter(ByteTarget& target, const RecordingHeader& header)
      : header_(header), text_(target), markers_(usedMarkers(header)), triggers_(usedTriggers(header)) {
    text_ << "sample,time_s,value";
    writeNames(text_, markers_, ktorba::markerName);
    writeNames(text_, triggers_, ktorba::triggerName);
    text_ << ",instruction,line\n";
  }

  void take(const RecordingBlock& block) override {
    block.samples.visit([&](const auto& samples) { writeRows(block, samples); });
  }
  void finish() override { text_.flush(); }

 private:
  template <typename Samples>
  void writeRows(const RecordingBlock& block, const Samples& samples) {
    std::size_t nextMarker = 0;
    std::size_t nextSegment = 0;
    std::uint64_t sample = block.firstSample;
    for (const auto value : samples) {
      unsigned high = 0;
      nextMarker = passEvents(block.markers, nextMarker, sample, [&](const MarkerEvent& event) { high |= event.mask; });
      nextSegment = passEvents(block.segments, nextSegment, sample,
                               [&](const SegmentStart& segment) { address_ = segment.address; });
      writeRow(sample++, value, high);
    }
  }

  void writeRow(std::uint64_t sample, std::int32_t value, unsigned high) {
    unsigned raised = 0;
    nextTrigger_ = passEvents(std::span(header_.triggers), nextTrigger_, sample,
                              [&](const TriggerEvent& event) { raised |= ktorba::clearFlagOf(event.trigger); });
    text_ << sample << ',' << static_cast<double>(sample) / header_.sampleRateHz << ',' << value;
    writeBits(text_, high, markers_, ktorba::markerBitOf);
    writeBits(text_, raised, triggers_, ktorba::clearFlagOf);
    text_ << ',' << address_ << ',' << header_.program[address_].line << '\n';
  }

  const RecordingHeader& header_;
  TextWriter text_;
  std::vector<unsigned> markers_;
  std::vector<unsigned> triggers_;
  std::size_t nextTrigger_ = 0;
  std::uint32_t address_ = 0;  // of what plays
};

std::uint64_t countDigits(std::uint64_t number) { return std::to_string(number).size(); }

// The digits of all numbers from 0 up to, not including, `end`.
std::uint64_t digitsBelow(std::uint64_t end) {
  std::uint64_t digits = end;  // the last of each
  for (std::uint64_t power = 10; power < end; power *= 10) {
    digits = saturatedBytes(1, end - power, digits);
    if (power > UINT64_MAX / 10) break;
  }
  return digits;
}

// The array format's header: a magic, two bytes of version, the length of the text and the text, 64-byte aligned.
std::string npyHeader(const RecordingHeader& header) {
  std::string text = "{'descr': '<i" + std::to_string(header.bytesPerSample()) +
                     "', 'fortran_order': False, 'shape': (" + std::to_string(header.sampleCount) + ",), }";
  constexpr std::size_t kFixedBytes = 10;
  text.append(63 - (kFixedBytes + text.size()) % 64, ' ');
  text += '\n';
  const std::string magic("\x93NUMPY\x01\x00", 8);
  return magic + static_cast<char>(text.size() & 0xFF) + static_cast<char>(text.size() >> 8) + text;
}

// Appends `value` little-endian.
template <typename Sample>
char* putLittleEndian(char* out, Sample value) {
  for (std::size_t byte = 0; byte < sizeof(value); ++byte) *out++ = static_cast<char>(value >> (8 * byte) & 0xFF);
  return out;
}

class SampleWriter final : public OutputWriter {
 public:
  SampleWriter(ByteTarget& target, const std::string& header) : target_(target) {
    target_.write(header.data(), header.size());
  }

  void take(const RecordingBlock& block) override {
    block.samples.visit([this](const auto& samples) { writeSamples(samples); });
  }
  void finish() override {}

 private:
  template <typename Samples>
  void writeSamples(const Samples& samples) {
    std::array<char, 65536> bytes;
    char* end = bytes.data();
    for (const auto sample : samples) {
      end = putLittleEndian(end, sample);
      if (end < bytes.data() + bytes.size()) continue;
      target_.write(bytes.data(), bytes.size());
      end = bytes.data();
    }
    target_.write(bytes.data(), static_cast<std::size_t>(end - bytes.data()));
  }

  ByteTarget& target_;
};

}  // namespace

// A row is its numbers, a comma between each two, and the end of the line.
SizeBounds boundCsv(const RecordingHeader& header) {
  constexpr std::uint64_t kMostHeading = 256;
  constexpr std::uint64_t kCommasAndEnd = 5;
  constexpr std::uint64_t kLongestTime = std::numeric_limits<double>::max_digits10 + 7;  // -1.2e-308
  const std::uint64_t flags = usedMarkers(header).size() + usedTriggers(header).size();
  const std::uint64_t longestValue = header.sampleWidthBits == 16 ? 6 : 11;
  std::uint64_t longestPlace = 1;
  for (const PlayedInstruction& played : header.program) {
    longestPlace = std::max(longestPlace, countDigits(header.program.size()) + countDigits(played.line));
  }
  const std::uint64_t leastRow = kCommasAndEnd + 2 * flags + 4;
  const std::uint64_t greatestRow = kCommasAndEnd + 2 * flags + kLongestTime + longestValue + longestPlace;
  const std::uint64_t numbers = digitsBelow(header.endSample()) - digitsBelow(header.firstSample);
  return {saturatedBytes(leastRow, header.sampleCount, numbers),
          saturatedBytes(greatestRow, header.sampleCount, saturatedBytes(1, numbers, kMostHeading))};
}

std::unique_ptr<OutputWriter> writeCsv(ByteTarget& target, const RecordingHeader& header) {
  return std::make_unique<CsvWriter>(target, header);
}

SizeBounds boundNpy(const RecordingHeader& header) {
  const std::uint64_t bytes = saturatedBytes(header.bytesPerSample(), header.sampleCount, npyHeader(header).size());
  return {bytes, bytes};
}

std::unique_ptr<OutputWriter> writeNpy(ByteTarget& target, const RecordingHeader& header) {
  return writeSamplesBehind(npyHeader(header), target);
}

std::unique_ptr<OutputWriter> writeSamplesBehind(const std::string& bytes, ByteTarget& target) {
  return std::make_unique<SampleWriter>(target, bytes);
}

}  // namespace tools
