// The FPGA interface library as the process finds it at run time: KtFpga().StartFifo(session, fifo) calls
// KtFpgaDll_StartFifo of platform/fpga/KtFpga.h. Any thread may call; see BoundFunction.h for what a missing library
// does.
#pragma once

#include "platform/fpga/BoundFunction.h"
#include "platform/fpga/KtFpga.h"

namespace platform {

struct KtFpgaLibrary {
#define KTORBA_BIND(name) BoundFunction<decltype(KtFpgaDll_##name)> name{"KtFpga", "KtFpgaDll_" #name};
  KTORBA_BIND(GetBitfileSignature)
  KTORBA_BIND(FindFifoPrivate)
  KTORBA_BIND(FindRegisterPrivate)
  KTORBA_BIND(ConfigureFifo2)
  KTORBA_BIND(StartFifo)
  KTORBA_BIND(StopFifo)
  KTORBA_BIND(WriteFifoU8)
  KTORBA_BIND(ReadFifoU8)
  KTORBA_BIND(AcquireFifoWriteElementsU8)
  KTORBA_BIND(AcquireFifoReadElementsU8)
  KTORBA_BIND(ReleaseFifoElements)
  KTORBA_BIND(GetPeerToPeerFifoEndpoint)
#undef KTORBA_BIND
};

inline constinit KtFpgaLibrary theKtFpgaLibrary;

inline KtFpgaLibrary& KtFpga() { return theKtFpgaLibrary; }

}  // namespace platform
