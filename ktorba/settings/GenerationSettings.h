// What the host asks of a generator, in the host's units; one record per session. The settings calculator turns it
// into hardware settings. A plain value: copy it, change the copy, apply the copy.
#pragma once

#include <cstdint>
#include <string>

namespace ktorba {

struct GenerationSettings {
  std::uint16_t memoryReadGrantTime = 60;
  std::uint16_t memoryWriteGrantTime = 30;
  std::uint32_t primingDepth = 800;        // samples
  std::uint32_t activeScriptLength = 200;  // memory words of the active script; 0: none, 0xFFFFFFFF: it has no end
  std::string streamingWaveformName;       // UTF-8; empty: streaming is off

  bool operator==(const GenerationSettings&) const = default;
};

}  // namespace ktorba
