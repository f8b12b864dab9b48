// The generator that a script is meant for: its traits as the user gives them, and as the library takes
// them.
#pragma once

#include <cstdint>
#include <string>

#include "ktWfmScriptCompiler/ScriptTraits.h"
#include "ktorba/hwRecords/HWTraits.h"
#include "tools/text/Refusal.h"

namespace tools {

struct GeneratorOptions {
  unsigned sampleWidthBits = 16;  // 16 or 32
  double sampleRateHz = 1e6;
  std::uint32_t memorySizeBytes = 64u << 20;  // sample memory
  std::uint32_t memoryWordBytes = 16;
  std::uint32_t minFetchSamples = 64;     // shortest waveform, subset, wait and marker distance
  std::uint32_t sequenceWords = 4096;     // sequence memory, instructions
  std::uint32_t maxPrimingWords = 512;    // memory words
  std::uint32_t primingDepthSamples = 0;  // asked for; 0: the library's default

  std::uint32_t bytesPerSample() const { return sampleWidthBits / 8; }
  std::uint64_t memorySamples() const { return memorySizeBytes / bytesPerSample(); }
};

// Throws Refusal, with setting and bounds, when no generator can have such traits.
void checkWorkable(const GeneratorOptions& options);

// Throws Refusal unless `value`, of `what` in `unit` (" bytes"), lies within its bounds.
void requireWithin(std::uint64_t value, Bounds bounds, Setting setting, const std::string& what,
                   const std::string& unit);

ktorba::HWTraits toHWTraits(const GeneratorOptions& options);
ktwfmscriptcompiler::ScriptTraits toScriptTraits(const GeneratorOptions& options);

// "16-bit samples at 1 MS/s, 67 108 864 bytes of memory in words of 16, 4 096 instructions".
std::string describe(const GeneratorOptions& options);

}  // namespace tools
