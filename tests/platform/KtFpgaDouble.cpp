#include "platform/KtFpgaDouble.h"

#include <algorithm>

#include "platform/KtFpga.h"

namespace {

template <typename... Arguments>
std::int32_t called(const char* function, Arguments... arguments) {
  auto& fpga = ktFpgaDouble();
  fpga.record.add(function, arguments...);
  if (fpga.results.empty()) return 0;
  const std::int32_t result = fpga.results.front();
  fpga.results.pop_front();
  return result;
}

std::uint8_t fifoMemory[] = {5};

}  // namespace

KtFpgaDouble& ktFpgaDouble() {
  static KtFpgaDouble instance;
  return instance;
}

int32_t KtFpgaDll_GetBitfileSignature(uint32_t session, uint32_t* signature, uint32_t* count) {
  std::fill_n(signature, *count, 0xABCD);
  return called("GetBitfileSignature", session, *count);
}

int32_t KtFpgaDll_FindFifoPrivate(uint32_t session, const char* name, uint32_t typeFilter, uint32_t* result) {
  *result = 36;
  return called((std::string("FindFifo ") + name).c_str(), session, typeFilter);
}

int32_t KtFpgaDll_FindRegisterPrivate(uint32_t session, const char* name, uint32_t typeFilter, uint32_t* result) {
  *result = 35;
  return called((std::string("FindRegister ") + name).c_str(), session, typeFilter);
}

int32_t KtFpgaDll_ConfigureFifo2(uint32_t session, uint32_t fifo, uint64_t requestedDepth, uint64_t* actualDepth) {
  *actualDepth = 1;
  return called("ConfigureFifo2", session, fifo, requestedDepth);
}

int32_t KtFpgaDll_StartFifo(uint32_t session, uint32_t fifo) { return called("StartFifo", session, fifo); }
int32_t KtFpgaDll_StopFifo(uint32_t session, uint32_t fifo) { return called("StopFifo", session, fifo); }

int32_t KtFpgaDll_WriteFifoU8(uint32_t session, uint32_t fifo, const uint8_t* data, uint64_t count, uint32_t timeoutMs,
                              uint64_t* emptyElementsRemaining) {
  *emptyElementsRemaining = 1;
  return called("WriteFifoU8", session, fifo, *data, count, timeoutMs);
}

int32_t KtFpgaDll_ReadFifoU8(uint32_t session, uint32_t fifo, uint8_t* data, uint64_t count, uint32_t timeoutMs,
                             uint64_t* elementsRemaining) {
  *data = 5;
  *elementsRemaining = 1;
  return called("ReadFifoU8", session, fifo, count, timeoutMs);
}

int32_t KtFpgaDll_AcquireFifoWriteElementsU8(uint32_t session, uint32_t fifo, uint8_t** elements, uint64_t count,
                                             uint32_t timeoutMs, uint64_t* acquired, uint64_t* remaining) {
  *elements = fifoMemory;
  *acquired = 1;
  *remaining = 2;
  return called("AcquireFifoWriteElementsU8", session, fifo, count, timeoutMs);
}

int32_t KtFpgaDll_AcquireFifoReadElementsU8(uint32_t session, uint32_t fifo, uint8_t** elements, uint64_t count,
                                            uint32_t timeoutMs, uint64_t* acquired, uint64_t* remaining) {
  *elements = fifoMemory;
  *acquired = 1;
  *remaining = 2;
  return called("AcquireFifoReadElementsU8", session, fifo, count, timeoutMs);
}

int32_t KtFpgaDll_ReleaseFifoElements(uint32_t session, uint32_t fifo, uint64_t count) {
  return called("ReleaseFifoElements", session, fifo, count);
}

int32_t KtFpgaDll_GetPeerToPeerFifoEndpoint(uint32_t session, uint32_t fifo, uint32_t* endpoint) {
  *endpoint = 1;
  return called("GetPeerToPeerFifoEndpoint", session, fifo);
}
