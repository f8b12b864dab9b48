// What a generator played: samples, markers, triggers, and which instruction of the script each stretch came from.
// Every output is drawn or written from this record alone. Sample numbers count from the first sample played.
// Markers and instructions are kept as events, so that a long play costs little more than its samples.
#pragma once

#include <cstdint>
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
};

// A stretch of samples from one instruction; the passes of a wait for a trigger are one segment.
struct Segment {
  std::uint64_t firstSample = 0;
  std::uint64_t sampleCount = 0;
  std::uint32_t address = 0;  // index into Recording::program
};

struct Recording {
  std::string title;
  double sampleRateHz = 1e6;
  SampleBuffer samples;
  std::vector<MarkerEvent> markers;    // ascending
  std::vector<TriggerEvent> triggers;  // ascending
  std::vector<Segment> segments;       // ascending, without gaps
  std::vector<PlayedInstruction> program;
};

// The markers that fire anywhere, ascending.
std::vector<unsigned> usedMarkers(const Recording& recording);

// The hardware triggers that were raised, ascending.
std::vector<unsigned> usedTriggers(const Recording& recording);

}  // namespace tools
