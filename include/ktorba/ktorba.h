/* The waveform-generation library. */
#ifndef KTORBA_KTORBA_H
#define KTORBA_KTORBA_H

#include <stdint.h>

#ifndef __cplusplus
#include <stdbool.h>
#endif

#ifdef __cplusplus
extern "C" {
#endif

typedef struct tStatus tStatus;

struct tStatus {
  int32_t code;
  uint32_t capacity;
  bool (*reallocJson)(tStatus* self, uint32_t newCapacity);
  char* json;
};

#ifdef __cplusplus
}
#endif

#endif
