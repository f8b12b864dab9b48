#include "tools/player/simulatedGenerator.h"

#include "ktorba/script/instructionFormat.h"
#include "tools/text/Refusal.h"
#include "tools/text/quantities.h"

namespace tools {
namespace {

constexpr double kLeastSampleRateHz = 1e-3;
constexpr double kGreatestSampleRateHz = 1e12;
// Instructions skip up to one sample less.
constexpr std::uint32_t kMostSamplesPerWord = 1u << ktorba::fetch_field::kHeadSkip.width;

void requireWithin(std::uint64_t value, Bounds bounds, Setting setting, const std::string& what,
                   const std::string& unit) {
  if (value >= bounds.least && value <= bounds.greatest) return;
  throw Refusal(what + " must be " + std::to_string(bounds.least) + " to " + std::to_string(bounds.greatest) + unit, {},
                setting, bounds);
}

void require(bool condition, Setting setting, const std::string& rule) {
  if (!condition) throw Refusal(rule, {}, setting);
}

}  // namespace

void checkOptions(const GeneratorOptions& options) {
  ktSim_Traits least;
  ktSim_Traits greatest;
  ktSim_TraitLimits(&least, &greatest);
  require(options.sampleWidthBits == least.sampleWidthBits || options.sampleWidthBits == greatest.sampleWidthBits,
          Setting::kSampleWidth, "samples must have 16 or 32 bits");
  require(options.sampleRateHz >= kLeastSampleRateHz && options.sampleRateHz <= kGreatestSampleRateHz,
          Setting::kSampleRate,
          "the sample rate must be " + formatQuantity(kLeastSampleRateHz, "S/s") + " to " +
              formatQuantity(kGreatestSampleRateHz, "S/s"));
  requireWithin(options.memoryWordBytes, {least.memoryWordBytes, greatest.memoryWordBytes}, Setting::kMemoryWord,
                "a memory word", " bytes");
  require(options.memoryWordBytes % options.bytesPerSample() == 0, Setting::kMemoryWord,
          "a memory word must be a whole number of samples");
  require(options.memoryWordBytes / options.bytesPerSample() <= kMostSamplesPerWord, Setting::kMemoryWord,
          "a memory word must hold at most " + std::to_string(kMostSamplesPerWord) +
              " samples, the most that instructions can skip");
  require(options.memorySizeBytes >= options.memoryWordBytes, Setting::kMemory,
          "the memory must hold at least one memory word");
  requireWithin(options.minFetchSamples, {1, greatest.minFetchSamples}, Setting::kMinFetch, "the shortest fetch",
                " samples");
  requireWithin(options.sequenceWords, {least.sequenceWords, greatest.sequenceWords}, Setting::kSequenceMemory,
                "the sequence memory", " instructions");
  requireWithin(options.maxPrimingWords, {least.maxPrimingWords, greatest.maxPrimingWords}, Setting::kMaxPriming,
                "the largest priming depth", " memory words");
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
