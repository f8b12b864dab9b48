// libktifwu: the interface framework's names for the simulated device.
#include "platform/fpga/ktifwu.h"

#include "simulator/platformCalls.h"

void ktIFW_Context_Contextualize(uint32_t session, uint32_t context, uint64_t localOffset, uint8_t* subsystem,
                                 uint64_t* busOffset, tStatus* status) {
  ktSimDevice_Context_Contextualize(session, context, localOffset, subsystem, busOffset, status);
}

void ktIFW_Context_GetInfo(uint32_t session, uint32_t context, uint16_t* first, uint16_t* second, uint16_t* third,
                           uint16_t* fourth, tStatus* status) {
  ktSimDevice_Context_GetInfo(session, context, first, second, third, fourth, status);
}

void ktIFW_Context_GetSubsystemAndOffset(uint32_t session, uint32_t context, uint8_t* subsystem, uint64_t* baseOffset,
                                         tStatus* status) {
  ktSimDevice_Context_GetSubsystemAndOffset(session, context, subsystem, baseOffset, status);
}

void ktIFW_Context_CheckVersion(uint32_t session, uint32_t context, uint16_t major, uint16_t minor, bool flag,
                                uint8_t* first, uint8_t* second, tStatus* status) {
  ktSimDevice_Context_CheckVersion(session, context, major, minor, flag, first, second, status);
}

void ktIFW_Context_GetChild(uint32_t session, uint16_t childType, uint8_t flag, uint32_t context, uint32_t* child,
                            tStatus* status) {
  ktSimDevice_Context_GetChild(session, childType, flag, context, child, status);
}

void ktIFW_Context_GetChildrenByUid(uint32_t session, uint32_t context, uint16_t uid, uint32_t* children,
                                    uint32_t capacity, uint32_t* count, tStatus* status) {
  ktSimDevice_Context_GetChildrenByUid(session, context, uid, children, capacity, count, status);
}

void ktIFW_Context_GetAllChildren(uint32_t session, uint32_t context, uint32_t* children, uint32_t capacity,
                                  uint32_t* count, tStatus* status) {
  ktSimDevice_Context_GetAllChildren(session, context, children, capacity, count, status);
}

void ktIFW_Target_Read(uint32_t target, uint8_t subsystem, uint64_t offset, uint64_t* value, uint32_t timeoutMs,
                       tStatus* status) {
  ktSimDevice_Target_Read(target, subsystem, offset, value, timeoutMs, status);
}

void ktIFW_Target_ReadArray(uint32_t target, const uint8_t* subsystems, const uint64_t* offsets, uint32_t count,
                            uint64_t* values, uint32_t timeoutMs, tStatus* status) {
  ktSimDevice_Target_ReadArray(target, subsystems, offsets, count, values, timeoutMs, status);
}

void ktIFW_Target_Write(uint32_t target, uint8_t subsystem, uint64_t offset, uint64_t value, bool flag,
                        uint32_t timeoutMs, tStatus* status) {
  ktSimDevice_Target_Write(target, subsystem, offset, value, flag, timeoutMs, status);
}

void ktIFW_Target_WriteArray(uint32_t target, const uint8_t* subsystems, const uint64_t* offsets,
                             const uint64_t* values, uint32_t count, bool flag, uint32_t timeoutMs, tStatus* status) {
  ktSimDevice_Target_WriteArray(target, subsystems, offsets, values, count, flag, timeoutMs, status);
}

void ktIFW_Target_Reset(uint32_t target, tStatus* status) { ktSimDevice_Target_Reset(target, status); }
