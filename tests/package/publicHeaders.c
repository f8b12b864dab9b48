#include "ktorba/ktorba.h"

int32_t startWithFreshStatus(uint32_t sessionHandle);
int32_t startWithFreshStatus(uint32_t sessionHandle) {
  tStatus status = {0, 0, NULL, NULL};
  return ktORBA_StartGeneration(sessionHandle, &status);
}
