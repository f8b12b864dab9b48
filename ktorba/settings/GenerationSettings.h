// What the host asks of a generator, in the host's units; one record per session. The settings calculator turns it
// into hardware settings. A plain value: copy it, change the copy, apply the copy.
#pragma once

#include <cstdint>
#include <string>

#include "conventions/conventions.h"

namespace ktorba {

struct GenerationSettings {
  std::uint16_t memoryReadGrantTime = kDefaultReadGrantTime;
  std::uint16_t memoryWriteGrantTime = kDefaultWriteGrantTime;
  std::uint32_t primingDepth = 4 * kDefaultPrimingWords;    // samples; until a session knows how many a word holds
  std::uint32_t activeScriptLength = kDefaultPrimingWords;  // memory words; 0: no script, 0xFFFFFFFF: it has no end
  std::string streamingWaveformName;                        // UTF-8; empty: streaming is off

  bool operator==(const GenerationSettings&) const = default;
};

}  // namespace ktorba
