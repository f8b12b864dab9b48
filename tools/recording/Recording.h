// What a generator plays, as it is handed on: a header that tells what will come, then blocks one behind the other.
// Every output is drawn or written from these alone, whoever makes them. Samples are numbered as they were played: from
// the start of the play, so that the first of a window has another number than 0.
#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "tools/recording/SampleBuffer.h"

namespace tools {

enum class SegmentKind : std::uint8_t { kWaveform, kWait, kWaitForTrigger };

struct MarkerEvent {
  std::uint64_t sample = 0;  // the one sample at which the markers are high
  std::uint8_t mask = 0;     // bit n: marker n
};

struct TriggerEvent {
  std::uint64_t sample = 0;
  unsigned trigger = 0;  // hardware trigger
};

// An instruction word of the script that was played, by its address.
struct PlayedInstruction {
  SegmentKind kind = SegmentKind::kWait;
  std::string name;            // of the waveform; of the trigger waited for; empty for a counted wait
  std::uint32_t line = 0;      // of the script, from 1; 0 for the words that frame every script
  std::uint32_t position = 0;  // in that line, bytes from 1; 0 likewise
  // The address of the first instruction of the same fetch, which markers split into several; its own else.
  std::uint32_t firstOfFetch = 0;
};

// Where an instruction begins to play. It plays until the next one begins; the passes of a wait for a trigger begin
// once.
struct SegmentStart {
  std::uint64_t sample = 0;
  std::uint32_t address = 0;  // index into RecordingHeader::program
};

// Known before the first sample.
struct RecordingHeader {
  std::string title;
  double sampleRateHz = 1e6;
  unsigned sampleWidthBits = 16;  // 16 or 32
  std::uint64_t firstSample = 0;
  std::uint64_t sampleCount = 0;
  std::uint8_t markerMask = 0;         // of the markers that fire in it; bit n: marker n
  std::vector<TriggerEvent> triggers;  // raised in it, ascending
  std::vector<PlayedInstruction> program;

  std::uint64_t endSample() const { return firstSample + sampleCount; }
  std::uint32_t bytesPerSample() const { return sampleWidthBits / 8; }
};

// The numbers of the markers that fire in it, ascending, and of the hardware triggers that are raised.
std::vector<unsigned> usedMarkers(const RecordingHeader& header);
std::vector<unsigned> usedTriggers(const RecordingHeader& header);

// Of any length above 0; what it points to lives until the call that it is handed to returns.
struct RecordingBlock {
  std::uint64_t firstSample = 0;
  SampleSpan samples;
  std::span<const MarkerEvent> markers;    // that fire in it, ascending
  std::span<const SegmentStart> segments;  // that begin in it, ascending; one at the first sample of all
};

// What takes recordings. Blocks come in order, without gaps; all together are as many samples as the header says.
class RecordingSink {
 public:
  virtual ~RecordingSink() = default;
  virtual void take(const RecordingBlock& block) = 0;
};

// What of a recording somebody looks at; of the rest, blocks may hold nothing.
struct RecordingParts {
  bool samples = false;
  bool markers = false;
  bool segments = false;

  bool any() const { return samples || markers || segments; }
  RecordingParts& operator|=(const RecordingParts& other) {
    samples = samples || other.samples;
    markers = markers || other.markers;
    segments = segments || other.segments;
    return *this;
  }
};

}  // namespace tools
