#include "cli/program/GeneratorOptions.h"

#include "cli/UserError.h"
#include "cli/quantities.h"

namespace cli {
namespace {

constexpr std::uint32_t kMaxMinFetchSamples = 255;      // register 0 has eight bits
constexpr std::uint32_t kMaxSequenceWords = 1u << 24;   // of the simulated generator
constexpr std::uint32_t kMaxPrimingWords = 65535;       // register 5 has sixteen bits
constexpr std::uint32_t kMaxSamplesPerMemoryWord = 16;  // an instruction's skips have four bits
constexpr std::uint32_t kLeastMemoryWordBytes = 8;
constexpr std::uint32_t kMaxMemoryWordBytes = 64;

void require(bool condition, const char* option, const std::string& rule) {
  if (!condition) throw UserError(std::string(option) + ": " + rule);
}

}  // namespace

void checkOptions(const GeneratorOptions& options) {
  require(options.sampleWidthBits == 16 || options.sampleWidthBits == 32, "--sample-width", "must be 16 or 32");
  require(options.sampleRateHz > 0, "--sample-rate", "must be above 0");
  const std::uint32_t word = options.memoryWordBytes;
  require(word >= kLeastMemoryWordBytes && word <= kMaxMemoryWordBytes && word % options.bytesPerSample() == 0,
          "--memory-word", "must be a whole number of samples in 8 to 64 bytes");
  require(word / options.bytesPerSample() <= kMaxSamplesPerMemoryWord, "--memory-word",
          "must hold at most 16 samples, the most that instructions can skip");
  require(options.memorySizeBytes >= word, "--memory", "must hold at least one memory word");
  require(options.minFetchSamples >= 1 && options.minFetchSamples <= kMaxMinFetchSamples, "--min-fetch",
          "must be 1 to 255 samples");
  require(options.sequenceWords >= 1 && options.sequenceWords <= kMaxSequenceWords, "--sequence-memory",
          "must be 1 to 16777216 instructions");
  require(options.maxPrimingWords <= kMaxPrimingWords, "--max-priming", "must be 0 to 65535 memory words");
}

ktorba::HWTraits toHWTraits(const GeneratorOptions& options) {
  ktorba::HWTraits traits;
  traits.minFetchSamplesByte = static_cast<std::uint8_t>(options.minFetchSamples);
  traits.memoryWordBits = static_cast<std::uint16_t>(options.memoryWordBytes * 8);
  traits.memorySizeBytes = options.memorySizeBytes;
  traits.sequenceMemoryWords = options.sequenceWords;
  traits.maxPrimingWords = static_cast<std::uint16_t>(options.maxPrimingWords);
  traits.sampleWidthBits = static_cast<std::uint8_t>(options.sampleWidthBits);
  traits.samplesPerMemoryWord = options.memoryWordBytes / options.bytesPerSample();
  traits.minFetchSamples = options.minFetchSamples;
  traits.alignmentQuantum = 1;
  return traits;
}

ktSim_Traits toSimulatorTraits(const GeneratorOptions& options) {
  ktSim_Traits traits;
  ktSim_DefaultTraits(&traits);
  traits.sampleWidthBits = options.sampleWidthBits;
  traits.memoryWordBytes = options.memoryWordBytes;
  traits.memorySizeBytes = options.memorySizeBytes;
  traits.minFetchSamples = options.minFetchSamples;
  traits.sequenceWords = options.sequenceWords;
  traits.maxPrimingWords = options.maxPrimingWords;
  return traits;
}

ktwfmscriptcompiler::ScriptTraits toScriptTraits(const GeneratorOptions& options) {
  ktwfmscriptcompiler::ScriptTraits traits = ktwfmscriptcompiler::standardScriptTraits();
  traits.alignmentQuantum = toHWTraits(options).alignmentQuantum;
  traits.minWaitLength = options.minFetchSamples;
  return traits;
}

std::string describe(const GeneratorOptions& options) {
  return std::to_string(options.sampleWidthBits) + "-bit samples at " + formatQuantity(options.sampleRateHz, "S/s") +
         ", " + formatCount(options.memorySizeBytes) + " bytes of memory in words of " +
         std::to_string(options.memoryWordBytes) + ", " + formatCount(options.sequenceWords) + " instructions";
}

}  // namespace cli
