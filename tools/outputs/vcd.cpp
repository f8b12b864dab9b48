#include <algorithm>
#include <array>
#include <bit>
#include <cmath>

#include "conventions/conventions.h"
#include "tools/outputs/TextWriter.h"
#include "tools/outputs/formats.h"

namespace tools {
namespace {

// Identifier codes of the variables.
constexpr char kSampleCode = '!';
constexpr char kAddressCode = '"';
constexpr char kLineCode = '#';
char markerCode(unsigned marker) { return static_cast<char>('A' + marker); }
char triggerCode(unsigned trigger) { return static_cast<char>('a' + trigger - ktorba::kStartTrigger); }

constexpr std::string_view kUnits[] = {"s", "ms", "us", "ns", "ps", "fs"};
constexpr int kFinestExponent = 15;
constexpr int kPicoseconds = 12;

// The coarsest unit 10^-exponent seconds of which the sample period is a whole number; picoseconds where none is.
struct TimeScale {
  explicit TimeScale(double sampleRateHz) : rateHz(sampleRateHz) {
    while (exponent < kFinestExponent && !isWhole(ticksPerSample())) ++exponent;
    if (!isWhole(ticksPerSample())) exponent = kPicoseconds;
    ticksPerSecond = std::pow(10.0, exponent);
  }
  double ticksPerSample() const { return std::pow(10.0, exponent) / rateHz; }
  std::uint64_t ticks(std::uint64_t sample) const {
    return static_cast<std::uint64_t>(std::llround(static_cast<double>(sample) * ticksPerSecond / rateHz));
  }
  std::string text() const {
    const int unit = (exponent + 2) / 3;
    const char* const factors[] = {"1", "100", "10"};
    return std::string(factors[exponent % 3]) + " " + std::string(kUnits[unit]);
  }
  static bool isWhole(double x) { return x >= 1 && std::abs(x - std::round(x)) <= 1e-12 * x; }

  double rateHz;
  int exponent = 0;
  double ticksPerSecond = 1;
};

class VcdWriter {
 public:
  VcdWriter(OutputFile& file, const Recording& recording, const Progress& progress)
      : text_(file),
        recording_(recording),
        progress_(progress),
        scale_(recording.sampleRateHz),
        markers_(usedMarkers(recording)) {}

  void write() {
    writeHeader();
    const std::uint64_t count = recording_.samples.size();
    for (sample_ = 0; sample_ < count; ++sample_) {
      if (sample_ % kSamplesPerStep == 0) progress_(static_cast<double>(sample_) / static_cast<double>(count));
      writeSample();
    }
    text_ << '#' << scale_.ticks(count) << '\n';
    text_.flush();
  }

 private:
  void writeVariable(std::string_view type, unsigned width, char code, const std::string& name) {
    text_ << "$var " << type << ' ' << width << ' ' << code << ' ' << name << " $end\n";
  }

  void writeHeader() {
    const unsigned width = recording_.samples.widthBits();
    text_ << "$version ktorba $end\n$timescale " << scale_.text() << " $end\n$scope module generator $end\n";
    writeVariable("wire", width, kSampleCode, "sample [" + std::to_string(width - 1) + ":0]");
    for (const unsigned marker : markers_) writeVariable("wire", 1, markerCode(marker), ktorba::markerName(marker));
    for (const unsigned trigger : usedTriggers(recording_)) {
      writeVariable("event", 1, triggerCode(trigger), ktorba::triggerName(trigger));
    }
    writeVariable("integer", 32, kAddressCode, "instruction");
    writeVariable("integer", 32, kLineCode, "line");
    text_ << "$upscope $end\n$enddefinitions $end\n";
  }

  void writeSample() {
    isTimeWritten_ = false;
    writeLevel();
    writeMarkers();
    for (; trigger_ < recording_.triggers.size() && recording_.triggers[trigger_].sample <= sample_; ++trigger_) {
      at() << '1' << triggerCode(recording_.triggers[trigger_].trigger) << '\n';
    }
    writeSegment();
  }

  void writeLevel() {
    const std::int32_t value = recording_.samples[sample_];
    if (sample_ > 0 && value == recording_.samples[sample_ - 1]) return;
    writeVector(static_cast<std::uint32_t>(value), recording_.samples.widthBits(), kSampleCode);
  }

  void writeMarkers() {
    unsigned high = 0;
    for (; marker_ < recording_.markers.size() && recording_.markers[marker_].sample <= sample_; ++marker_) {
      high |= recording_.markers[marker_].mask;
    }
    for (const unsigned marker : markers_) {
      const unsigned bit = ktorba::markerBitOf(marker);
      const bool isChanged = ((high ^ high_) & bit) != 0;
      if (isChanged || sample_ == 0) at() << ((high & bit) != 0 ? '1' : '0') << markerCode(marker) << '\n';
    }
    high_ = high;
  }

  void writeSegment() {
    for (; segment_ < recording_.segments.size() && recording_.segments[segment_].firstSample <= sample_; ++segment_) {
      const std::uint32_t address = recording_.segments[segment_].address;
      writeVector(address, 32, kAddressCode);
      writeVector(recording_.program.at(address).line, 32, kLineCode);
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
    if (!isTimeWritten_) text_ << '#' << scale_.ticks(sample_) << '\n';
    isTimeWritten_ = true;
    return text_;
  }

  TextWriter text_;
  const Recording& recording_;
  const Progress& progress_;
  TimeScale scale_;
  std::vector<unsigned> markers_;  // that fire anywhere
  std::uint64_t sample_ = 0;
  std::size_t marker_ = 0;   // first event not yet written
  std::size_t trigger_ = 0;  // likewise
  std::size_t segment_ = 0;  // likewise
  unsigned high_ = 0;        // markers high at the sample before
  bool isTimeWritten_ = false;
};

}  // namespace

void writeVcd(OutputFile& file, const Recording& recording, const Progress& progress) {
  VcdWriter(file, recording, progress).write();
}

}  // namespace tools
