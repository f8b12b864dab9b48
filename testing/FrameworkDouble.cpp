#include "testing/FrameworkDouble.h"

#include <algorithm>

#include "conventions/conventions.h"
#include "ktorba/hwRecords/registers.h"
#include "platform/fpga/ktifwu.h"

namespace {

using ktorba::Register;

constexpr std::uint32_t kChildrenPerContext = 10;
constexpr std::uint32_t kGenerator = 1;

FrameworkDouble framework;

// Out of the way of calls that benchmarks count on, as are children of a test's own.
template <typename... Values>
[[gnu::noinline]] void record(const char* function, Values... values) {
  std::string& call = framework.calls.emplace_back(function);
  ((call += ' ' + std::to_string(values)), ...);
}

// What every call does at its end.
template <typename... Values>
void called(tStatus* status, const char* function, Values... values) {
  ++framework.callCount;
  if (framework.isRecording) [[unlikely]]
    record(function, values...);
  if (framework.report) [[unlikely]]
    framework.report(*status);
}

std::uint32_t listChildren(std::uint32_t context, std::uint32_t* children, std::uint32_t capacity) {
  const std::uint32_t first = std::min(context * kChildrenPerContext + 1, framework.contexts);
  const std::uint32_t count = std::min(kChildrenPerContext, framework.contexts - first);
  for (std::uint32_t i = 0; i < std::min(capacity, count); ++i) children[i] = first + i;
  return count;
}

[[gnu::noinline]] std::uint32_t listOwnChildren(std::uint32_t context, std::uint32_t* children,
                                                std::uint32_t capacity) {
  const std::vector<std::uint32_t> all = framework.children(context);
  std::copy_n(all.begin(), std::min<std::size_t>(all.size(), capacity), children);
  return framework.announced != 0 ? framework.announced : static_cast<std::uint32_t>(all.size());
}

}  // namespace

FrameworkDouble& frameworkDouble() { return framework; }

FrameworkDouble::FrameworkDouble() {
  const auto set = [this](Register which, std::uint64_t value) { registers[static_cast<std::size_t>(which)] = value; };
  set(Register::kMinFetchSamples, 64);
  set(Register::kSampleWidthBits, 16);
  set(Register::kMemoryWordBits, 128);
  set(Register::kMemorySizeBytes, 1u << 28);
  set(Register::kSequenceMemoryWords, 4096);
  set(Register::kMaxPrimingWords, 512);
  set(Register::kGenerationStatus, ktorba::kStatusDone | ktorba::kStatusWriteComplete);
  set(Register::kStreamingFreeSpace, 1000);
}

void ktIFW_Context_Contextualize(uint32_t session, uint32_t context, uint64_t localOffset, uint8_t* subsystem,
                                 uint64_t* busOffset, tStatus* status) {
  *subsystem = 1;
  *busOffset = localOffset;
  called(status, "Contextualize", session, context, localOffset);
}

void ktIFW_Context_GetInfo(uint32_t session, uint32_t context, uint16_t* first, uint16_t* second, uint16_t* third,
                           uint16_t* fourth, tStatus* status) {
  *first = ktorba::kGeneratorContextType;
  *second = *third = *fourth = 0;
  called(status, "GetInfo", session, context);
}

void ktIFW_Context_CheckVersion(uint32_t session, uint32_t context, uint16_t major, uint16_t minor, bool flag,
                                uint8_t* first, uint8_t* second, tStatus* status) {
  *first = *second = 0;
  called(status, "CheckVersion", session, context, major, minor, flag);
}

void ktIFW_Context_GetChild(uint32_t session, uint16_t childType, uint8_t flag, uint32_t context, uint32_t* child,
                            tStatus* status) {
  *child = kGenerator;
  called(status, "GetChild", session, childType, flag, context);
}

void ktIFW_Context_GetAllChildren(uint32_t session, uint32_t context, uint32_t* children, uint32_t capacity,
                                  uint32_t* count, tStatus* status) {
  *count =
      framework.children ? listOwnChildren(context, children, capacity) : listChildren(context, children, capacity);
  called(status, "GetAllChildren", session, context, capacity);
}

void ktIFW_Target_Read(uint32_t target, uint8_t subsystem, uint64_t offset, uint64_t* value, uint32_t timeoutMs,
                       tStatus* status) {
  *value = framework.registers[offset % std::size(framework.registers)];
  called(status, "Read", target, subsystem, offset, timeoutMs);
}

void ktIFW_Target_ReadArray(uint32_t target, const uint8_t* subsystems, const uint64_t* offsets, uint32_t count,
                            uint64_t* values, uint32_t timeoutMs, tStatus* status) {
  called(status, "ReadArray", target, count, timeoutMs);
  for (uint32_t i = 0; i < count; ++i) {
    values[i] = framework.registers[offsets[i] % std::size(framework.registers)];
    if (framework.isRecording) record("-", subsystems[i], offsets[i]);
  }
}

void ktIFW_Target_Write(uint32_t target, uint8_t subsystem, uint64_t offset, uint64_t value, bool flag,
                        uint32_t timeoutMs, tStatus* status) {
  called(status, "Write", target, subsystem, offset, value, flag, timeoutMs);
}

void ktIFW_Target_WriteArray(uint32_t target, const uint8_t* subsystems, const uint64_t* offsets,
                             const uint64_t* values, uint32_t count, bool flag, uint32_t timeoutMs, tStatus* status) {
  called(status, "WriteArray", target, count, flag, timeoutMs);
  if (!framework.isRecording) return;
  for (uint32_t i = 0; i < count; ++i) record("-", subsystems[i], offsets[i], values[i]);
}

void ktIFW_Target_Reset(uint32_t target, tStatus* status) { called(status, "Reset", target); }
