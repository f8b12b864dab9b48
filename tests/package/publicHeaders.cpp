#include "ktorba/ktorba.h"

std::int32_t rewind(std::uint32_t sessionHandle) {
  tStatus status{};
  return ktORBA_SetWaveformNextWritePosition(sessionHandle, "w", 0, ktORBA_kFromStart, &status);
}
