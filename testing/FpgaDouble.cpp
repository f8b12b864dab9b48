#include "testing/FpgaDouble.h"

#include <algorithm>
#include <cstring>

#include "platform/fpga/KtFpga.h"

namespace {

std::uint8_t fifoMemory[40960];
FpgaDouble fpga;

}  // namespace

FpgaDouble& fpgaDouble() { return fpga; }

int32_t KtFpgaDll_GetBitfileSignature(uint32_t, uint32_t* signature, uint32_t* count) {
  ++fpga.callCount;
  std::fill_n(signature, *count, 1u);
  return 0;
}

int32_t KtFpgaDll_FindFifoPrivate(uint32_t, const char*, uint32_t, uint32_t* result) {
  ++fpga.callCount;
  *result = 0;
  return 0;
}

int32_t KtFpgaDll_ConfigureFifo2(uint32_t, uint32_t, uint64_t, uint64_t* actualDepth) {
  ++fpga.callCount;
  *actualDepth = sizeof fifoMemory;
  return 0;
}

int32_t KtFpgaDll_StartFifo(uint32_t, uint32_t) {
  ++fpga.callCount;
  return 0;
}

int32_t KtFpgaDll_StopFifo(uint32_t, uint32_t) {
  ++fpga.callCount;
  return 0;
}

// Copies, as a driver does into the memory that the FPGA reads.
int32_t KtFpgaDll_WriteFifoU8(uint32_t, uint32_t, const uint8_t* data, uint64_t count, uint32_t,
                              uint64_t* emptyElementsRemaining) {
  ++fpga.callCount;
  std::memcpy(fifoMemory, data, std::min<std::uint64_t>(count, sizeof fifoMemory));
  const auto* const expected = static_cast<const std::uint8_t*>(fpga.expectedData);
  if (data < expected || data + count > expected + fpga.expectedCount) fpga.bytesFromElsewhere += count;
  *emptyElementsRemaining = sizeof fifoMemory;
  return 0;
}
