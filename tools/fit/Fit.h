// Whether waveforms and scripts fit a generator, by how much, and how long they play: measured once, told by whoever
// asks. One thread at a time.
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "tools/diagnostics/JsonWriter.h"
#include "tools/fit/MemoryMap.h"
#include "tools/program/ProgramBuilder.h"
#include "tools/timeline/Folding.h"
#include "tools/timeline/PlayLength.h"

namespace tools {

// What a host does besides placing the waveforms.
struct FitRequest {
  std::vector<RaisedTrigger> triggers;
  std::vector<std::string> cleared;  // waveforms that it gives up once all are placed: their memory is free again
  std::string streaming;             // the streaming waveform; empty: none
};

struct WaveformFit {
  std::string name;
  std::uint64_t samples = 0;
  std::optional<std::string> refusal;  // why it has no place
  std::uint64_t firstByte = 0;         // of its block
  std::uint64_t bytes = 0;             // of its block: whole memory words
};

// What the generator reads ahead before it starts.
struct PrimingFit {
  std::uint32_t askedSamples = 0;
  std::uint32_t words = 0;
  std::uint64_t samples = 0;   // that so many words hold; skipped ones among them are not played
  bool isWholeScript = false;  // it holds no more words, and may hold fewer than were asked for
  std::optional<std::string> refusal;
};

struct ScriptFit {
  Program program;
  PlayLength length = PlayLength::tooLong();
  PrimingFit priming;
  std::optional<std::string> refusal;  // why the sequence memory cannot hold it

  std::uint64_t instructions() const { return program.entry.instructionWords.size(); }
  bool fits() const { return !refusal && !priming.refusal; }
};

// The streaming waveform as a ring that the host writes while it plays.
struct StreamingFit {
  std::string waveform;
  std::uint64_t samples = 0;
  std::optional<std::string> refusal;
};

struct Fit {
  GeneratorOptions generator;
  std::vector<WaveformFit> waveforms;
  std::uint64_t usedBytes = 0;  // of sample memory, with all waveforms in it
  std::uint64_t largestFreeBytes = 0;
  std::vector<ScriptFit> scripts;       // that could be built
  std::vector<Diagnostic> diagnostics;  // of those that could not
  std::vector<std::string> cleared;     // waveforms, as requested
  std::optional<StreamingFit> streaming;
  std::vector<std::string> idleTriggers;  // that are raised, and no script asks for them; none where one is missing

  bool fits() const;
  // Without the waveforms that were cleared.
  MemoryMap memoryMap() const;
};

// Places a waveform, or makes it known without a place.
WaveformFit placeWaveform(const WaveformLength& waveform, ProgramBuilder& builder);

// Places the waveforms and builds the scripts that `builder` has compiled for that generator. Throws Refusal where a
// waveform that is cleared or streamed is not among them.
Fit measureFit(ProgramBuilder& builder, std::span<const WaveformLength> waveforms, const GeneratorOptions& generator,
               const FitRequest& request = {});

// Adds to the open object: "fits", "waveforms", "memoryBytes", "largestFreeBytes", "memoryMap", "streaming", "scripts",
// "idleTriggers".
void addFit(const Fit& fit, JsonWriter& json);

}  // namespace tools
