#include "ktorba/error_codes.h"
#include "ktorba/ktorba.h"
#include "ktorba/simulator.h"

bool rewind(uint32_t sessionHandle) {
  tStatus status{};
  return ktORBA_SetWaveformNextWritePosition(sessionHandle, "w", 0, ktORBA_kFromStart, &status) !=
         ktorba_errors_kErrorSpecifiedWaveformNotFound;
}
