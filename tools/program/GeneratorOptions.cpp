#include "tools/program/GeneratorOptions.h"

#include "tools/text/quantities.h"

namespace tools {
ktorba::HWTraits toHWTraits(const GeneratorOptions& options) {
  ktorba::HWTraits traits;
  traits.minFetchSamplesByte = static_cast<std::uint8_t>(options.minFetchSamples);
  traits.memoryWordBits = static_cast<std::uint16_t>(options.memoryWordBytes * 8);
  traits.memorySizeBytes = options.memorySizeBytes;
  traits.sequenceMemoryWords = options.sequenceWords;
  traits.maxPrimingWords = static_cast<std::uint16_t>(options.maxPrimingWords);
  traits.sampleWidthBits = static_cast<std::uint8_t>(options.sampleWidthBits);
  ktorba::deriveTraits(traits);
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

}  // namespace tools
