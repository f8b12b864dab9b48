#include "platform/fpga/ktifwu.h"

#include <algorithm>

#include "ktorba/hwRecords/registers.h"
#include "platformDouble.h"

namespace {

using ktorba::Register;

constexpr std::uint32_t kChildrenPerContext = 10;
constexpr std::uint32_t kGenerator = 1;

std::uint64_t calls = 0;
std::uint32_t contexts = 2;
std::uint64_t registers[32];  // by number

std::uint64_t& at(Register number) { return registers[static_cast<std::size_t>(number)]; }

const bool registersAreSet = [] {
  at(Register::kMinFetchSamples) = 64;
  at(Register::kSampleWidthBits) = 16;
  at(Register::kMemoryWordBits) = 128;
  at(Register::kMemorySizeBytes) = 1u << 28;
  at(Register::kSequenceMemoryWords) = 4096;
  at(Register::kMaxPrimingWords) = 512;
  at(Register::kGenerationStatus) = ktorba::kStatusDone | ktorba::kStatusWriteComplete;
  at(Register::kStreamingFreeSpace) = 1000;
  return true;
}();

}  // namespace

std::uint64_t ktDouble_frameworkCalls() { return calls; }

void ktDouble_setContexts(std::uint32_t count) { contexts = count; }

void ktIFW_Context_Contextualize(uint32_t, uint32_t, uint64_t localOffset, uint8_t* subsystem, uint64_t* busOffset,
                                 tStatus*) {
  ++calls;
  *subsystem = 1;
  *busOffset = localOffset;
}

void ktIFW_Context_GetInfo(uint32_t, uint32_t, uint16_t* first, uint16_t* second, uint16_t* third, uint16_t* fourth,
                           tStatus*) {
  ++calls;
  *first = 101;
  *second = *third = *fourth = 0;
}

void ktIFW_Context_CheckVersion(uint32_t, uint32_t, uint16_t, uint16_t, bool, std::uint8_t* first, std::uint8_t* second,
                                tStatus*) {
  ++calls;
  *first = *second = 0;
}

void ktIFW_Context_GetChild(uint32_t, uint16_t, uint8_t, uint32_t, uint32_t* child, tStatus*) {
  ++calls;
  *child = kGenerator;
}

void ktIFW_Context_GetAllChildren(uint32_t, uint32_t context, uint32_t* children, uint32_t capacity, uint32_t* count,
                                  tStatus*) {
  ++calls;
  const std::uint32_t first = std::min(context * kChildrenPerContext + 1, contexts);
  *count = std::min(kChildrenPerContext, contexts - first);
  for (std::uint32_t i = 0; i < std::min(capacity, *count); ++i) children[i] = first + i;
}

void ktIFW_Target_Read(uint32_t, uint8_t, uint64_t offset, uint64_t* value, uint32_t, tStatus*) {
  ++calls;
  *value = registers[offset];
}

void ktIFW_Target_Write(uint32_t, uint8_t, uint64_t, uint64_t, bool, uint32_t, tStatus*) { ++calls; }

void ktIFW_Target_WriteArray(uint32_t, const uint8_t*, const uint64_t*, const uint64_t*, uint32_t, bool, uint32_t,
                             tStatus*) {
  ++calls;
}
