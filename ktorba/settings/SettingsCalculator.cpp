#include "ktorba/settings/SettingsCalculator.h"

#include <algorithm>

#include "kterr/Failure.h"

namespace ktorba {
namespace {

constexpr char kSource[] = R"(includes\ktorba\settings\SettingsCalculator)";
constexpr std::uint32_t kStreamingParamC = 20;

std::uint32_t divideRoundingUp(std::uint64_t value, std::uint32_t divisor) {
  return static_cast<std::uint32_t>((value + divisor - 1) / divisor);
}

// The last of `count` words that begin at `start`; `start` itself when there are none.
std::uint32_t lastWord(std::uint32_t start, std::uint32_t count) { return count == 0 ? start : start + count - 1; }

void setStreamingName(const std::string& name, HWSettingsRecord& record) {
  if (name.size() > kMaxStreamingNameLength) {
    kterr::Failure(ktmxl::kErrorNameTooLong)
        .at(kSource)
        .usage(kterr::kUsageTypeMaxLength, std::uint64_t{kMaxStreamingNameLength})
        .raise();
  }
  name.copy(record.streamingWaveformName, name.size());
  record.streamingWaveformNameLength = static_cast<std::uint32_t>(name.size());
}

}  // namespace

void SettingsCalculator::calculateSettings(const WaveformFinderInterface& waveforms,
                                           const GenerationSettings& requested, AdjustedSettings& adjusted,
                                           HWSettingsRecord& hardware) const {
  static_cast<GenerationSettings&>(adjusted) = requested;
  HWSettingsRecord record;
  HWSettings& settings = record.settings;
  const std::uint32_t words = primingWords(requested.primingDepth);
  adjusted.actualPrimingDepth = words * traits_.samplesPerMemoryWord;
  const std::uint32_t scriptWords = requested.activeScriptLength;
  settings.primingDepthWords = scriptWords == 0 ? words : std::min(words, scriptWords);
  settings.memoryReadGrantTime = requested.memoryReadGrantTime;
  settings.memoryWriteGrantTime = requested.memoryWriteGrantTime;
  setStreamingName(requested.streamingWaveformName, record);
  if (!requested.streamingWaveformName.empty()) {
    placeStreaming(waveforms.getWaveform(requested.streamingWaveformName), settings);
  }
  hardware = record;
}

std::uint32_t SettingsCalculator::primingWords(std::uint32_t samples) const {
  if (traits_.samplesPerMemoryWord == 0) {
    kterr::Failure(ktorba_errors::kErrorInternalSWError)
        .at(kSource)
        .message("ktorba::SettingsCalculator", "samplesPerMemoryWord is 0: a sample is wider than a memory word")
        .raise();
  }
  const std::uint32_t limit = traits_.maxPrimingWords * traits_.samplesPerMemoryWord;
  if (samples > limit) {
    kterr::Failure(ktorba_errors::kErrorPrimingDepthTooLarge)
        .at(kSource)
        .usage(kterr::kUsageTypeMaxValue, limit)
        .raise();
  }
  return divideRoundingUp(samples, traits_.samplesPerMemoryWord);
}

void SettingsCalculator::placeStreaming(const WaveformEntry& waveform, HWSettings& settings) const {
  const std::uint32_t grantTime = std::uint32_t{settings.memoryReadGrantTime} + settings.memoryWriteGrantTime;
  if (waveform.allocatedLength <= 2 * grantTime) {
    kterr::Failure(ktorba_errors::kErrorRequestedWaveformLengthIsTooSmall)
        .at(kSource)
        .usage(kterr::kUsageTypeWaveformLength, waveform.allocatedLength)
        .usage(kterr::kUsageTypeMinWaveformLength, 2 * grantTime + 1)
        .raise();
  }
  const std::uint32_t wordBytes = traits_.memoryWordBytes();
  const std::uint64_t lengthBytes = std::uint64_t{traits_.sampleBytes()} * waveform.allocatedLength;
  const std::uint32_t startWord = waveform.memoryOffset / wordBytes;
  settings.streamingEnabled = true;
  settings.streamingStartWord = startWord;
  settings.streamingEndWord = lastWord(startWord, divideRoundingUp(lengthBytes, wordBytes));
  settings.streamingWritePointerWord = lastWord(startWord, divideRoundingUp(waveform.writePosition, wordBytes));
  settings.streamingParamA = grantTime;
  settings.streamingParamB = grantTime;
  settings.streamingParamC = kStreamingParamC;
}

}  // namespace ktorba
