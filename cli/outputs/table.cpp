// CSV and NPY.
#include <array>

#include "cli/outputs/TextWriter.h"
#include "cli/outputs/formats.h"

namespace cli {
namespace {

void writeBits(TextWriter& text, unsigned bits, unsigned used) {
  for (unsigned bit = 0; bit < 8; ++bit) {
    if ((used >> bit & 1) != 0) text << ((bits >> bit & 1) != 0 ? ",1" : ",0");
  }
}

void writeNames(TextWriter& text, const char* stem, unsigned used) {
  for (unsigned bit = 0; bit < 8; ++bit) {
    if ((used >> bit & 1) != 0) text << ',' << stem << bit;
  }
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

void writeCsv(AtomicFile& file, const Recording& recording) {
  TextWriter text(file);
  const unsigned markers = usedMarkers(recording);
  const unsigned triggers = usedTriggers(recording);
  text << "sample,time_s,value";
  writeNames(text, "marker", markers);
  writeNames(text, "trigger", triggers);
  text << ",instruction,line\n";
  std::size_t nextMarker = 0;
  std::size_t nextTrigger = 0;
  std::size_t segment = 0;
  for (std::uint64_t sample = 0; sample < recording.samples.size(); ++sample) {
    while (segment + 1 < recording.segments.size() && recording.segments[segment + 1].firstSample <= sample) ++segment;
    const std::uint32_t address = recording.segments.at(segment).address;
    text << sample << ',' << static_cast<double>(sample) / recording.sampleRateHz << ',' << recording.samples[sample];
    writeBits(text, collectBits(recording.markers, nextMarker, sample, [](const MarkerEvent& e) { return e.mask; }),
              markers);
    writeBits(
        text,
        collectBits(recording.triggers, nextTrigger, sample, [](const TriggerEvent& e) { return 1u << e.number; }),
        triggers);
    text << ',' << address << ',' << recording.program.at(address).line << '\n';
  }
  text.flush();
}

void writeNpy(AtomicFile& file, const Recording& recording) {
  const std::string header = npyHeader(recording.samples);
  file.write(header.data(), header.size());
  recording.samples.visit([&file](const auto& samples) {
    std::array<char, 65536> block;
    char* end = block.data();
    for (const auto sample : samples) {
      end = putLittleEndian(end, sample);
      if (end < block.data() + block.size()) continue;
      file.write(block.data(), block.size());
      end = block.data();
    }
    file.write(block.data(), static_cast<std::size_t>(end - block.data()));
  });
}

}  // namespace cli
