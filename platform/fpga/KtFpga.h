// The C interface of the FPGA interface library (libKtFpga.so, KtFpga.dll), as far as this library calls it: DMA
// FIFOs of bytes, found by name. Every function takes the FPGA session first and returns a status: 0, a negative
// error or a positive warning. Counts and depths are in elements, which are bytes; time-outs in milliseconds.
// Shared by the binding that calls it and by the simulated generator that implements it.
#pragma once

#include <stdint.h>

#ifdef __cplusplus
extern "C" {
#endif

// Writes up to *count words of the bitfile's signature; the engine asks for 4 (128 bits).
int32_t KtFpgaDll_GetBitfileSignature(uint32_t session, uint32_t* signature, uint32_t* count);

// Look a resource up by name; `typeFilter` 0xFFFFFFFF accepts every type. Results: FIFO number, register offset.
int32_t KtFpgaDll_FindFifoPrivate(uint32_t session, const char* name, uint32_t typeFilter, uint32_t* result);
int32_t KtFpgaDll_FindRegisterPrivate(uint32_t session, const char* name, uint32_t typeFilter, uint32_t* result);

int32_t KtFpgaDll_ConfigureFifo2(uint32_t session, uint32_t fifo, uint64_t requestedDepth, uint64_t* actualDepth);
int32_t KtFpgaDll_StartFifo(uint32_t session, uint32_t fifo);
int32_t KtFpgaDll_StopFifo(uint32_t session, uint32_t fifo);

int32_t KtFpgaDll_WriteFifoU8(uint32_t session, uint32_t fifo, const uint8_t* data, uint64_t count, uint32_t timeoutMs,
                              uint64_t* emptyElementsRemaining);
int32_t KtFpgaDll_ReadFifoU8(uint32_t session, uint32_t fifo, uint8_t* data, uint64_t count, uint32_t timeoutMs,
                             uint64_t* elementsRemaining);

// Direct access to FIFO memory: acquire, fill or read in place, release.
int32_t KtFpgaDll_AcquireFifoWriteElementsU8(uint32_t session, uint32_t fifo, uint8_t** elements, uint64_t count,
                                             uint32_t timeoutMs, uint64_t* acquired, uint64_t* remaining);
int32_t KtFpgaDll_AcquireFifoReadElementsU8(uint32_t session, uint32_t fifo, uint8_t** elements, uint64_t count,
                                            uint32_t timeoutMs, uint64_t* acquired, uint64_t* remaining);
int32_t KtFpgaDll_ReleaseFifoElements(uint32_t session, uint32_t fifo, uint64_t count);

int32_t KtFpgaDll_GetPeerToPeerFifoEndpoint(uint32_t session, uint32_t fifo, uint32_t* endpoint);

#ifdef __cplusplus
}
#endif
