#include "ktorba/error_codes.h"
#include "ktorba/ktorba.h"
#include "ktorba/simulator.h"

int isInvalidHandle(uint32_t sessionHandle);
int isInvalidHandle(uint32_t sessionHandle) {
  tStatus status = {0, 0, 0, 0};
  return ktORBA_StartGeneration(sessionHandle, &status) == ktorba_nKTAPALS100_tStatus_kInvalidParameter;
}
