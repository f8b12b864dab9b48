#include "testing/KtifwuDouble.h"

#include <algorithm>

#include "platform/fpga/ktifwu.h"

namespace {

template <typename... Values>
void called(tStatus* status, const char* function, Values... values) {
  auto& framework = ktifwuDouble();
  if (framework.recording) {
    std::string call = function;
    ((call += ' ' + std::to_string(values)), ...);
    framework.calls.push_back(call);
  }
  if (framework.report) framework.report(*status);
}

}  // namespace

KtifwuDouble& ktifwuDouble() {
  static KtifwuDouble instance;
  return instance;
}

void ktIFW_Context_GetAllChildren(uint32_t session, uint32_t context, uint32_t* children, uint32_t capacity,
                                  uint32_t* count, tStatus* status) {
  const auto all = ktifwuDouble().children(context);
  const auto given = static_cast<std::uint32_t>(all.size());
  *count = ktifwuDouble().announced != 0 ? ktifwuDouble().announced : given;
  std::copy_n(all.begin(), std::min(given, capacity), children);
  called(status, "GetAllChildren", session, context, capacity);
}
void ktIFW_Target_Read(uint32_t target, uint8_t subsystem, uint64_t offset, uint64_t* value, uint32_t timeoutMs,
                       tStatus* status) {
  *value = 7;
  called(status, "Read", target, subsystem, offset, timeoutMs);
}
void ktIFW_Target_ReadArray(uint32_t target, const uint8_t* subsystems, const uint64_t* offsets, uint32_t count,
                            uint64_t* values, uint32_t timeoutMs, tStatus* status) {
  called(status, "ReadArray", target, count, timeoutMs);
  for (uint32_t i = 0; i < count; ++i) {
    values[i] = 8 + i;
    called(status, "-", subsystems[i], offsets[i]);
  }
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
