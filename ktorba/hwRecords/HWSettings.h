// What the host can set on a generator, in the hardware's units, and the unit in which it travels between parts.
#pragma once

#include <cstdint>

#include "conventions/conventions.h"

namespace ktorba {

struct HWSettings {
  std::uint16_t memoryReadGrantTime = kDefaultReadGrantTime;
  std::uint16_t memoryWriteGrantTime = kDefaultWriteGrantTime;
  std::uint32_t primingDepthWords = kDefaultPrimingWords;  // memory words
  // The streaming fields are all 0 while streaming is off. Addresses are memory words.
  bool streamingEnabled = false;
  std::uint32_t streamingStartWord = 0;
  std::uint32_t streamingEndWord = 0;           // the last word itself, not one behind it
  std::uint32_t streamingParamA = 0;            // read grant time + write grant time
  std::uint32_t streamingParamB = 0;            // the same
  std::uint32_t streamingParamC = 0;            // 20
  std::uint32_t streamingWritePointerWord = 0;  // up to which the streaming waveform has been written

  bool operator==(const HWSettings&) const = default;
};

inline constexpr std::uint32_t kMaxStreamingNameLength = 511;

struct HWSettingsRecord {
  char streamingWaveformName[kMaxStreamingNameLength + 1] = {};  // NUL-terminated
  std::uint32_t streamingWaveformNameLength = 0;                 // bytes in use
  HWSettings settings;
};

}  // namespace ktorba
