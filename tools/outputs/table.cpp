// CSV and NPY.
#include <array>

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

// The bits that the events at `sample` set; `next` is the first event not yet passed.
template <typename Event, typename BitsOf>
unsigned collectBits(const std::vector<Event>& events, std::size_t& next, std::uint64_t sample, BitsOf bitsOf) {
  unsigned bits = 0;
  for (; next < events.size() && events[next].sample <= sample; ++next) bits |= bitsOf(events[next]);
  return bits;
}

// The array format's header: a magic, two bytes of version, the length of the text and the text, 64-byte aligned.
std::string npyHeader(const SampleBuffer& samples) {
  std::string text = "{'descr': '<i" + std::to_string(samples.widthBits() / 8) +
                     "', 'fortran_order': False, 'shape': (" + std::to_string(samples.size()) + ",), }";
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

}  // namespace

void writeCsv(OutputFile& file, const Recording& recording, const Progress& progress) {
  TextWriter text(file);
  const std::vector<unsigned> markers = usedMarkers(recording);
  const std::vector<unsigned> triggers = usedTriggers(recording);
  text << "sample,time_s,value";
  writeNames(text, markers, ktorba::markerName);
  writeNames(text, triggers, ktorba::triggerName);
  text << ",instruction,line\n";
  std::size_t nextMarker = 0;
  std::size_t nextTrigger = 0;
  std::size_t segment = 0;
  const std::uint64_t count = recording.samples.size();
  for (std::uint64_t sample = 0; sample < count; ++sample) {
    if (sample % kSamplesPerStep == 0) progress(static_cast<double>(sample) / static_cast<double>(count));
    while (segment + 1 < recording.segments.size() && recording.segments[segment + 1].firstSample <= sample) ++segment;
    const std::uint32_t address = recording.segments.at(segment).address;
    text << sample << ',' << static_cast<double>(sample) / recording.sampleRateHz << ',' << recording.samples[sample];
    writeBits(text, collectBits(recording.markers, nextMarker, sample, [](const MarkerEvent& e) { return e.mask; }),
              markers, ktorba::markerBitOf);
    writeBits(text,
              collectBits(recording.triggers, nextTrigger, sample,
                          [](const TriggerEvent& e) { return ktorba::clearFlagOf(e.trigger); }),
              triggers, ktorba::clearFlagOf);
    text << ',' << address << ',' << recording.program.at(address).line << '\n';
  }
  text.flush();
}

void writeNpy(OutputFile& file, const Recording& recording, const Progress& progress) {
  const std::string header = npyHeader(recording.samples);
  file.write(header.data(), header.size());
  recording.samples.visit([&](const auto& samples) {
    std::size_t written = 0;
    std::array<char, 65536> block;
    char* end = block.data();
    for (const auto sample : samples) {
      end = putLittleEndian(end, sample);
      if (end < block.data() + block.size()) continue;
      written += block.size() / sizeof(sample);
      progress(static_cast<double>(written) / static_cast<double>(samples.size()));
      file.write(block.data(), block.size());
      end = block.data();
    }
    file.write(block.data(), static_cast<std::size_t>(end - block.data()));
  });
}

}  // namespace tools
