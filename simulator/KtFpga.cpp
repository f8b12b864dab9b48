// libKtFpga: the FPGA interface library's names for the simulated device.
#include "platform/fpga/KtFpga.h"

#include "simulator/platformCalls.h"

int32_t KtFpgaDll_GetBitfileSignature(uint32_t session, uint32_t* signature, uint32_t* count) {
  return ktSimDevice_GetBitfileSignature(session, signature, count);
}

int32_t KtFpgaDll_FindFifoPrivate(uint32_t session, const char* name, uint32_t typeFilter, uint32_t* result) {
  return ktSimDevice_FindFifoPrivate(session, name, typeFilter, result);
}

int32_t KtFpgaDll_FindRegisterPrivate(uint32_t session, const char* name, uint32_t typeFilter, uint32_t* result) {
  return ktSimDevice_FindRegisterPrivate(session, name, typeFilter, result);
}

int32_t KtFpgaDll_ConfigureFifo2(uint32_t session, uint32_t fifo, uint64_t requestedDepth, uint64_t* actualDepth) {
  return ktSimDevice_ConfigureFifo2(session, fifo, requestedDepth, actualDepth);
}

int32_t KtFpgaDll_StartFifo(uint32_t session, uint32_t fifo) { return ktSimDevice_StartFifo(session, fifo); }

int32_t KtFpgaDll_StopFifo(uint32_t session, uint32_t fifo) { return ktSimDevice_StopFifo(session, fifo); }

int32_t KtFpgaDll_WriteFifoU8(uint32_t session, uint32_t fifo, const uint8_t* data, uint64_t count, uint32_t timeoutMs,
                              uint64_t* emptyElementsRemaining) {
  return ktSimDevice_WriteFifoU8(session, fifo, data, count, timeoutMs, emptyElementsRemaining);
}

int32_t KtFpgaDll_ReadFifoU8(uint32_t session, uint32_t fifo, uint8_t* data, uint64_t count, uint32_t timeoutMs,
                             uint64_t* elementsRemaining) {
  return ktSimDevice_ReadFifoU8(session, fifo, data, count, timeoutMs, elementsRemaining);
}

int32_t KtFpgaDll_AcquireFifoWriteElementsU8(uint32_t session, uint32_t fifo, uint8_t** elements, uint64_t count,
                                             uint32_t timeoutMs, uint64_t* acquired, uint64_t* remaining) {
  return ktSimDevice_AcquireFifoWriteElementsU8(session, fifo, elements, count, timeoutMs, acquired, remaining);
}

int32_t KtFpgaDll_AcquireFifoReadElementsU8(uint32_t session, uint32_t fifo, uint8_t** elements, uint64_t count,
                                            uint32_t timeoutMs, uint64_t* acquired, uint64_t* remaining) {
  return ktSimDevice_AcquireFifoReadElementsU8(session, fifo, elements, count, timeoutMs, acquired, remaining);
}

int32_t KtFpgaDll_ReleaseFifoElements(uint32_t session, uint32_t fifo, uint64_t count) {
  return ktSimDevice_ReleaseFifoElements(session, fifo, count);
}

int32_t KtFpgaDll_GetPeerToPeerFifoEndpoint(uint32_t session, uint32_t fifo, uint32_t* endpoint) {
  return ktSimDevice_GetPeerToPeerFifoEndpoint(session, fifo, endpoint);
}
