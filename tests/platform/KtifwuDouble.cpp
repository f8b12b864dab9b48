#include "platform/KtifwuDouble.h"

#include <algorithm>

#include "platform/ktifwu.h"

namespace {

template <typename Value>
void pass(std::string& call, int&, Value value) {
  call += ' ' + std::to_string(value);
}
template <typename Result>
void pass(std::string&, int& results, Result* result) {
  *result = static_cast<Result>(++results);
}

template <typename... Parameters>
void called(tStatus* status, const char* function, Parameters... parameters) {
  auto& framework = ktifwuDouble();
  if (framework.recording) {
    int results = 0;
    std::string call = function;
    (pass(call, results, parameters), ...);
    framework.calls.push_back(call);
  }
  if (framework.report) framework.report(*status);
}

void list(std::uint32_t context, std::uint32_t* numbers, std::uint32_t capacity, std::uint32_t* count) {
  const auto all = ktifwuDouble().children(context);
  *count = static_cast<std::uint32_t>(all.size());
  std::copy_n(all.begin(), std::min(*count, capacity), numbers);
}

}  // namespace

KtifwuDouble& ktifwuDouble() {
  static KtifwuDouble instance;
  return instance;
}

void ktIFW_Context_Contextualize(uint32_t session, uint32_t context, uint64_t localOffset, uint8_t* subsystem,
                                 uint64_t* busOffset, tStatus* status) {
  called(status, "Contextualize", session, context, localOffset, subsystem, busOffset);
}
void ktIFW_Context_GetInfo(uint32_t session, uint32_t context, uint16_t* first, uint16_t* second, uint16_t* third,
                           uint16_t* fourth, tStatus* status) {
  called(status, "GetInfo", session, context, first, second, third, fourth);
}
void ktIFW_Context_GetSubsystemAndOffset(uint32_t session, uint32_t context, uint8_t* subsystem, uint64_t* offset,
                                         tStatus* status) {
  called(status, "GetSubsystemAndOffset", session, context, subsystem, offset);
}
void ktIFW_Context_CheckVersion(uint32_t session, uint32_t context, uint16_t major, uint16_t minor, bool flag,
                                bool* first, bool* second, tStatus* status) {
  called(status, "CheckVersion", session, context, major, minor, flag, first);
  *second = false;
}
void ktIFW_Context_GetChild(uint32_t session, uint16_t childType, uint8_t flag, uint32_t context, uint32_t* child,
                            tStatus* status) {
  *child = ktifwuDouble().children(context).at(flag);
  called(status, "GetChild", session, childType, flag, context);
}
void ktIFW_Context_GetChildrenByUid(uint32_t session, uint32_t context, uint16_t uid, uint32_t* children,
                                    uint32_t capacity, uint32_t* count, tStatus* status) {
  list(context, children, capacity, count);
  called(status, "GetChildrenByUid", session, context, uid, capacity);
}
void ktIFW_Context_GetAllChildren(uint32_t session, uint32_t context, uint32_t* children, uint32_t capacity,
                                  uint32_t* count, tStatus* status) {
  list(context, children, capacity, count);
  called(status, "GetAllChildren", session, context, capacity);
}
void ktIFW_Target_Read(uint32_t target, uint8_t subsystem, uint64_t offset, uint64_t* value, uint32_t timeoutMs,
                       tStatus* status) {
  called(status, "Read", target, subsystem, offset, value, timeoutMs);
}
void ktIFW_Target_ReadArray(uint32_t target, const uint8_t* subsystems, const uint64_t* offsets, uint32_t count,
                            uint64_t* values, uint32_t timeoutMs, tStatus* status) {
  called(status, "ReadArray", target, count, timeoutMs);
  for (uint32_t i = 0; i < count; ++i) called(status, "-", subsystems[i], offsets[i], &values[i]);
}
void ktIFW_Target_Write(uint32_t target, uint8_t subsystem, uint64_t offset, uint64_t value, bool flag,
                        uint32_t timeoutMs, tStatus* status) {
  called(status, "Write", target, subsystem, offset, value, flag, timeoutMs);
}
void ktIFW_Target_WriteArray(uint32_t target, const uint8_t* subsystems, const uint64_t* offsets,
                             const uint64_t* values, uint32_t count, bool flag, uint32_t timeoutMs, tStatus* status) {
  called(status, "WriteArray", target, count, flag, timeoutMs);
  for (uint32_t i = 0; i < count; ++i) called(status, "-", subsystems[i], offsets[i], values[i]);
}
void ktIFW_Target_Reset(uint32_t target, tStatus* status) { called(status, "Reset", target); }
