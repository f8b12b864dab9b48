#include "platform/fpga/KtFpga.h"

#include <algorithm>
#include <cstring>

#include "platformDouble.h"

namespace {

std::uint8_t fifoMemory[40960];
std::uint64_t calls = 0;
const std::uint8_t* expectedData = nullptr;
std::uint64_t expectedCount = 0;
std::uint64_t bytesFromElsewhere = 0;

}  // namespace

std::uint64_t ktDouble_fpgaCalls() { return calls; }

void ktDouble_expectData(const void* data, std::uint64_t count) {
  expectedData = static_cast<const std::uint8_t*>(data);
  expectedCount = count;
  bytesFromElsewhere = 0;
}

std::uint64_t ktDouble_bytesFromElsewhere() { return bytesFromElsewhere; }

int32_t KtFpgaDll_GetBitfileSignature(uint32_t, uint32_t* signature, uint32_t* count) {
  ++calls;
  std::fill_n(signature, *count, 1u);
  return 0;
}

int32_t KtFpgaDll_FindFifoPrivate(uint32_t, const char*, uint32_t, uint32_t* result) {
  ++calls;
  *result = 0;
  return 0;
}

int32_t KtFpgaDll_ConfigureFifo2(uint32_t, uint32_t, uint64_t, uint64_t* actualDepth) {
  ++calls;
  *actualDepth = sizeof fifoMemory;
  return 0;
}

int32_t KtFpgaDll_StartFifo(uint32_t, uint32_t) {
  ++calls;
  return 0;
}

int32_t KtFpgaDll_StopFifo(uint32_t, uint32_t) {
  ++calls;
  return 0;
}

// Copies, as a driver does into the memory that the FPGA reads.
int32_t KtFpgaDll_WriteFifoU8(uint32_t, uint32_t, const uint8_t* data, uint64_t count, uint32_t,
                              uint64_t* emptyElementsRemaining) {
  ++calls;
  std::memcpy(fifoMemory, data, std::min<std::uint64_t>(count, sizeof fifoMemory));
  const bool isExpected = data >= expectedData && data + count <= expectedData + expectedCount;
  if (!isExpected) bytesFromElsewhere += count;
  *emptyElementsRemaining = sizeof fifoMemory;
  return 0;
}
