#include "platform/KtFpgaDouble.h"

#include "platform/KtFpga.h"

namespace {

template <typename... Parameters>
std::int32_t called(const char* function, Parameters... parameters) {
  auto& fpga = ktFpgaDouble();
  fpga.record.add(function, parameters...);
  if (fpga.results.empty()) return 0;
  const std::int32_t result = fpga.results.front();
  fpga.results.pop_front();
  return result;
}

std::uint8_t* fifoMemory() {
  static std::uint8_t memory[] = {5};
  return memory;
}

}  // namespace

KtFpgaDouble& ktFpgaDouble() {
  static KtFpgaDouble instance;
  return instance;
}

int32_t KtFpgaDll_GetBitfileSignature(uint32_t session, uint32_t* signature, uint32_t* count) {
  return called("GetBitfileSignature", session, *count, signature);
}
int32_t KtFpgaDll_FindFifoPrivate(uint32_t session, const char* name, uint32_t typeFilter, uint32_t* result) {
  return called("FindFifo", session, name, typeFilter, result);
}
int32_t KtFpgaDll_FindRegisterPrivate(uint32_t session, const char* name, uint32_t typeFilter, uint32_t* result) {
  return called("FindRegister", session, name, typeFilter, result);
}
int32_t KtFpgaDll_ConfigureFifo2(uint32_t session, uint32_t fifo, uint64_t depth, uint64_t* actualDepth) {
  return called("ConfigureFifo2", session, fifo, depth, actualDepth);
}
int32_t KtFpgaDll_StartFifo(uint32_t session, uint32_t fifo) { return called("StartFifo", session, fifo); }
int32_t KtFpgaDll_StopFifo(uint32_t session, uint32_t fifo) { return called("StopFifo", session, fifo); }
int32_t KtFpgaDll_WriteFifoU8(uint32_t session, uint32_t fifo, const uint8_t* data, uint64_t count, uint32_t timeoutMs,
                              uint64_t* empty) {
  return called("WriteFifoU8", session, fifo, *data, count, timeoutMs, empty);
}
int32_t KtFpgaDll_ReadFifoU8(uint32_t session, uint32_t fifo, uint8_t* data, uint64_t count, uint32_t timeoutMs,
                             uint64_t* remaining) {
  return called("ReadFifoU8", session, fifo, data, count, timeoutMs, remaining);
}
int32_t KtFpgaDll_AcquireFifoWriteElementsU8(uint32_t session, uint32_t fifo, uint8_t** elements, uint64_t count,
                                             uint32_t timeoutMs, uint64_t* acquired, uint64_t* remaining) {
  *elements = fifoMemory();
  return called("AcquireFifoWriteElementsU8", session, fifo, count, timeoutMs, acquired, remaining);
}
int32_t KtFpgaDll_AcquireFifoReadElementsU8(uint32_t session, uint32_t fifo, uint8_t** elements, uint64_t count,
                                            uint32_t timeoutMs, uint64_t* acquired, uint64_t* remaining) {
  *elements = fifoMemory();
  return called("AcquireFifoReadElementsU8", session, fifo, count, timeoutMs, acquired, remaining);
}
int32_t KtFpgaDll_ReleaseFifoElements(uint32_t session, uint32_t fifo, uint64_t count) {
  return called("ReleaseFifoElements", session, fifo, count);
}
int32_t KtFpgaDll_GetPeerToPeerFifoEndpoint(uint32_t session, uint32_t fifo, uint32_t* endpoint) {
  return called("GetPeerToPeerFifoEndpoint", session, fifo, endpoint);
}
