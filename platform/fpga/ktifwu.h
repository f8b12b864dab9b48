// The C interface of the interface framework (libktifwu.so, ktifwu.dll), as far as this library calls it: the tree of
// numbered contexts that describes an FPGA design, and register access by subsystem and offset. Context operations
// take the framework session first, target operations the target number; all report through `status`, code and
// elaboration text, given last. Time-outs are in milliseconds.
// Shared by the binding that calls it and by the simulated generator that implements it.
#pragma once

#include <stdint.h>

#include "ktorba/ktorba.h"

#ifdef __cplusplus
extern "C" {
#endif

// Turns an offset inside a context's register block into a bus address.
void ktIFW_Context_Contextualize(uint32_t session, uint32_t context, uint64_t localOffset, uint8_t* subsystem,
                                 uint64_t* busOffset, tStatus* status);
void ktIFW_Context_GetInfo(uint32_t session, uint32_t context, uint16_t* first, uint16_t* second, uint16_t* third,
                           uint16_t* fourth, tStatus* status);
void ktIFW_Context_GetSubsystemAndOffset(uint32_t session, uint32_t context, uint8_t* subsystem, uint64_t* baseOffset,
                                         tStatus* status);
// `first` and `second` are flags: 0, or any other value. A framework writes them as bytes, not always as 0 and 1.
void ktIFW_Context_CheckVersion(uint32_t session, uint32_t context, uint16_t major, uint16_t minor, bool flag,
                                uint8_t* first, uint8_t* second, tStatus* status);

// Child look-ups. The array forms write at most `capacity` numbers and always the true count; a first call with a
// null array and capacity 0 learns the count.
void ktIFW_Context_GetChild(uint32_t session, uint16_t childType, uint8_t flag, uint32_t context, uint32_t* child,
                            tStatus* status);
void ktIFW_Context_GetChildrenByUid(uint32_t session, uint32_t context, uint16_t uid, uint32_t* children,
                                    uint32_t capacity, uint32_t* count, tStatus* status);
void ktIFW_Context_GetAllChildren(uint32_t session, uint32_t context, uint32_t* children, uint32_t capacity,
                                  uint32_t* count, tStatus* status);

void ktIFW_Target_Read(uint32_t target, uint8_t subsystem, uint64_t offset, uint64_t* value, uint32_t timeoutMs,
                       tStatus* status);
void ktIFW_Target_ReadArray(uint32_t target, const uint8_t* subsystems, const uint64_t* offsets, uint32_t count,
                            uint64_t* values, uint32_t timeoutMs, tStatus* status);
void ktIFW_Target_Write(uint32_t target, uint8_t subsystem, uint64_t offset, uint64_t value, bool flag,
                        uint32_t timeoutMs, tStatus* status);
void ktIFW_Target_WriteArray(uint32_t target, const uint8_t* subsystems, const uint64_t* offsets,
                             const uint64_t* values, uint32_t count, bool flag, uint32_t timeoutMs, tStatus* status);
void ktIFW_Target_Reset(uint32_t target, tStatus* status);

#ifdef __cplusplus
}
#endif
