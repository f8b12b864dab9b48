// The platform functions as the device library exports them to the two thin libraries, which give them their own
// names. Internal: hosts use platform/fpga/KtFpga.h and platform/fpga/ktifwu.h.
#pragma once

#include <stdint.h>

#include "ktorba/ktorba.h"

#ifdef __cplusplus
extern "C" {
#endif

int32_t ktSimDevice_GetBitfileSignature(uint32_t session, uint32_t* signature, uint32_t* count);
int32_t ktSimDevice_FindFifoPrivate(uint32_t session, const char* name, uint32_t typeFilter, uint32_t* result);
int32_t ktSimDevice_FindRegisterPrivate(uint32_t session, const char* name, uint32_t typeFilter, uint32_t* result);
int32_t ktSimDevice_ConfigureFifo2(uint32_t session, uint32_t fifo, uint64_t requestedDepth, uint64_t* actualDepth);
int32_t ktSimDevice_StartFifo(uint32_t session, uint32_t fifo);
int32_t ktSimDevice_StopFifo(uint32_t session, uint32_t fifo);
int32_t ktSimDevice_WriteFifoU8(uint32_t session, uint32_t fifo, const uint8_t* data, uint64_t count,
                                uint32_t timeoutMs, uint64_t* emptyElementsRemaining);
int32_t ktSimDevice_ReadFifoU8(uint32_t session, uint32_t fifo, uint8_t* data, uint64_t count, uint32_t timeoutMs,
                               uint64_t* elementsRemaining);
int32_t ktSimDevice_AcquireFifoWriteElementsU8(uint32_t session, uint32_t fifo, uint8_t** elements, uint64_t count,
                                               uint32_t timeoutMs, uint64_t* acquired, uint64_t* remaining);
int32_t ktSimDevice_AcquireFifoReadElementsU8(uint32_t session, uint32_t fifo, uint8_t** elements, uint64_t count,
                                              uint32_t timeoutMs, uint64_t* acquired, uint64_t* remaining);
int32_t ktSimDevice_ReleaseFifoElements(uint32_t session, uint32_t fifo, uint64_t count);
int32_t ktSimDevice_GetPeerToPeerFifoEndpoint(uint32_t session, uint32_t fifo, uint32_t* endpoint);

void ktSimDevice_Context_Contextualize(uint32_t session, uint32_t context, uint64_t localOffset, uint8_t* subsystem,
                                       uint64_t* busOffset, tStatus* status);
void ktSimDevice_Context_GetInfo(uint32_t session, uint32_t context, uint16_t* first, uint16_t* second, uint16_t* third,
                                 uint16_t* fourth, tStatus* status);
void ktSimDevice_Context_GetSubsystemAndOffset(uint32_t session, uint32_t context, uint8_t* subsystem,
                                               uint64_t* baseOffset, tStatus* status);
void ktSimDevice_Context_CheckVersion(uint32_t session, uint32_t context, uint16_t major, uint16_t minor, bool flag,
                                      uint8_t* first, uint8_t* second, tStatus* status);
void ktSimDevice_Context_GetChild(uint32_t session, uint16_t childType, uint8_t flag, uint32_t context, uint32_t* child,
                                  tStatus* status);
void ktSimDevice_Context_GetChildrenByUid(uint32_t session, uint32_t context, uint16_t uid, uint32_t* children,
                                          uint32_t capacity, uint32_t* count, tStatus* status);
void ktSimDevice_Context_GetAllChildren(uint32_t session, uint32_t context, uint32_t* children, uint32_t capacity,
                                        uint32_t* count, tStatus* status);
void ktSimDevice_Target_Read(uint32_t target, uint8_t subsystem, uint64_t offset, uint64_t* value, uint32_t timeoutMs,
                             tStatus* status);
void ktSimDevice_Target_ReadArray(uint32_t target, const uint8_t* subsystems, const uint64_t* offsets, uint32_t count,
                                  uint64_t* values, uint32_t timeoutMs, tStatus* status);
void ktSimDevice_Target_Write(uint32_t target, uint8_t subsystem, uint64_t offset, uint64_t value, bool flag,
                              uint32_t timeoutMs, tStatus* status);
void ktSimDevice_Target_WriteArray(uint32_t target, const uint8_t* subsystems, const uint64_t* offsets,
                                   const uint64_t* values, uint32_t count, bool flag, uint32_t timeoutMs,
                                   tStatus* status);
void ktSimDevice_Target_Reset(uint32_t target, tStatus* status);

#ifdef __cplusplus
}
#endif
