#include "tools/player/simulatedGenerator.h"

#include "tools/text/Refusal.h"

namespace tools {
void checkOptions(const GeneratorOptions& options) {
  ktSim_Traits least;
  ktSim_Traits greatest;
  ktSim_TraitLimits(&least, &greatest);
  requireWithin(options.memoryWordBytes, {least.memoryWordBytes, greatest.memoryWordBytes}, Setting::kMemoryWord,
                "a memory word", " bytes");
  requireWithin(options.sequenceWords, {least.sequenceWords, greatest.sequenceWords}, Setting::kSequenceMemory,
                "the sequence memory", " instructions");
  checkWorkable(options);
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

}  // namespace tools
