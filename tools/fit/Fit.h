// Whether waveforms and scripts fit a generator, and by how much: measured once, told by whoever asks.
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "tools/diagnostics/JsonWriter.h"
#include "tools/program/ProgramBuilder.h"

namespace tools {

struct WaveformFit {
  std::string name;
  std::uint64_t samples = 0;
  std::optional<std::string> refusal;  // why it has no place
};

struct ScriptFit {
  Program program;
  std::string plays;                     // "12.3 ms", "for ever"
  std::optional<std::uint64_t> samples;  // nothing where nobody can count them
  std::uint32_t primingAsked = 0;        // samples
  std::uint32_t primingWords = 0;
  std::optional<std::string> refusal;  // why the sequence memory cannot hold it
  std::optional<std::string> primingRefusal;

  std::uint64_t instructions() const { return program.entry.instructionWords.size(); }
};

struct Fit {
  GeneratorOptions generator;
  std::vector<WaveformFit> waveforms;
  std::uint64_t usedBytes = 0;  // of sample memory
  std::uint64_t largestFreeBytes = 0;
  std::vector<ScriptFit> scripts;       // that could be built
  std::vector<Diagnostic> diagnostics;  // of those that could not

  bool fits() const;
};

// Places a waveform, or makes it known without a place.
WaveformFit placeWaveform(const WaveformLength& waveform, ProgramBuilder& builder);

// Places the waveforms and builds the scripts that `builder` has compiled for that generator.
Fit measureFit(ProgramBuilder& builder, std::span<const WaveformLength> waveforms, const GeneratorOptions& generator);

// Adds to the open object: "fits", "waveforms", "memoryBytes", "largestFreeBytes", "scripts".
void addFit(const Fit& fit, JsonWriter& json);

}  // namespace tools
