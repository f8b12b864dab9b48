#include "tools/program/GeneratorOptions.h"

#include "ktorba/script/instructionFormat.h"
#include "tools/text/quantities.h"

namespace tools {
namespace {

constexpr double kLeastSampleRateHz = 1e-3;
constexpr double kGreatestSampleRateHz = 1e12;
constexpr std::uint32_t kMostMinFetchSamples = 255;   // register 0 has eight bits
constexpr std::uint32_t kMostPrimingWords = 65535;    // register 5 has sixteen bits
constexpr std::uint32_t kMostMemoryWordBytes = 4096;  // and its register holds them in bits
// Instructions skip up to one sample less.
constexpr std::uint32_t kMostSamplesPerWord = 1u << ktorba::fetch_field::kHeadSkip.width;

void require(bool condition, Setting setting, const std::string& rule) {
  if (!condition) throw Refusal(rule, {}, setting);
}

}  // namespace

void requireWithin(std::uint64_t value, Bounds bounds, Setting setting, const std::string& what,
                   const std::string& unit) {
  if (value >= bounds.least && value <= bounds.greatest) return;
  throw Refusal(what + " must be " + std::to_string(bounds.least) + " to " + std::to_string(bounds.greatest) + unit, {},
                setting, bounds);
}

void checkWorkable(const GeneratorOptions& options) {
  require(options.sampleWidthBits == 16 || options.sampleWidthBits == 32, Setting::kSampleWidth,
          "samples must have 16 or 32 bits");
  require(options.sampleRateHz >= kLeastSampleRateHz && options.sampleRateHz <= kGreatestSampleRateHz,
          Setting::kSampleRate,
          "the sample rate must be " + formatQuantity(kLeastSampleRateHz, "S/s") + " to " +
              formatQuantity(kGreatestSampleRateHz, "S/s"));
  requireWithin(options.memoryWordBytes, {1, kMostMemoryWordBytes}, Setting::kMemoryWord, "a memory word", " bytes");
  require(options.memoryWordBytes % options.bytesPerSample() == 0, Setting::kMemoryWord,
          "a memory word must be a whole number of samples");
  require(options.memoryWordBytes / options.bytesPerSample() <= kMostSamplesPerWord, Setting::kMemoryWord,
          "a memory word must hold at most " + std::to_string(kMostSamplesPerWord) +
              " samples, the most that instructions can skip");
  require(options.memorySizeBytes >= options.memoryWordBytes, Setting::kMemory,
          "the memory must hold at least one memory word");
  requireWithin(options.minFetchSamples, {1, kMostMinFetchSamples}, Setting::kMinFetch, "the shortest fetch",
                " samples");
  requireWithin(options.sequenceWords, {1, UINT32_MAX}, Setting::kSequenceMemory, "the sequence memory",
                " instructions");
  requireWithin(options.maxPrimingWords, {0, kMostPrimingWords}, Setting::kMaxPriming, "the largest priming depth",
                " memory words");
}

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
