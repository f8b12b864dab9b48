#include "ktisl/FifoFpgaHw.h"

#include "platform/fpga/KtFpgaLibrary.h"

namespace ktisl {
namespace {

using platform::KtFpga;
using Status = Fifo<unsigned char>::Status;

constexpr char kSource[] = R"(ktisl\FifoFpgaHw)";

void merge(Status& status, std::int32_t code, std::uint32_t line = __builtin_LINE()) {
  kterr::mergeCode(status, code, kterr::kComponent, kSource, line);
}

}  // namespace

void FifoFpgaHw<unsigned char>::read(unsigned char* buffer, std::uint64_t count, std::uint32_t timeoutMs,
                                     std::uint64_t& elementsRemaining, Status& status) {
  if (failed(status)) return;
  merge(status, KtFpga().ReadFifoU8(fpgaSession_, fifo_, buffer, count, timeoutMs, &elementsRemaining));
}

void FifoFpgaHw<unsigned char>::write(const unsigned char* data, std::uint64_t count, std::uint32_t timeoutMs,
                                      std::uint64_t& emptyElementsRemaining, Status& status) {
  if (failed(status)) return;
  merge(status, KtFpga().WriteFifoU8(fpgaSession_, fifo_, data, count, timeoutMs, &emptyElementsRemaining));
}

void FifoFpgaHw<unsigned char>::configure(std::uint64_t requestedDepth, std::uint64_t& actualDepth, Status& status) {
  if (failed(status)) return;
  merge(status, KtFpga().ConfigureFifo2(fpgaSession_, fifo_, requestedDepth, &actualDepth));
}

void FifoFpgaHw<unsigned char>::restart(Status& status) {
  stop(status);
  start(status);
}

void FifoFpgaHw<unsigned char>::start(Status& status) {
  if (failed(status)) return;
  merge(status, KtFpga().StartFifo(fpgaSession_, fifo_));
}

void FifoFpgaHw<unsigned char>::stop(Status& status) {
  if (failed(status)) return;
  merge(status, KtFpga().StopFifo(fpgaSession_, fifo_));
}

void FifoFpgaHw<unsigned char>::acquireReadElements(unsigned char*& elements, std::uint64_t count,
                                                    std::uint32_t timeoutMs, std::uint64_t& acquired,
                                                    std::uint64_t& remaining, Status& status) {
  if (failed(status)) return;
  merge(status,
        KtFpga().AcquireFifoReadElementsU8(fpgaSession_, fifo_, &elements, count, timeoutMs, &acquired, &remaining));
}

void FifoFpgaHw<unsigned char>::acquireWriteElements(unsigned char*& elements, std::uint64_t count,
                                                     std::uint32_t timeoutMs, std::uint64_t& acquired,
                                                     std::uint64_t& remaining, Status& status) {
  if (failed(status)) return;
  merge(status,
        KtFpga().AcquireFifoWriteElementsU8(fpgaSession_, fifo_, &elements, count, timeoutMs, &acquired, &remaining));
}

void FifoFpgaHw<unsigned char>::releaseElements(std::uint64_t count, Status& status) {
  if (failed(status)) return;
  merge(status, KtFpga().ReleaseFifoElements(fpgaSession_, fifo_, count));
}

std::uint32_t FifoFpgaHw<unsigned char>::getPeerToPeerEndpoint(Status& status) {
  if (failed(status)) return 0;
  std::uint32_t endpoint = 0;
  merge(status, KtFpga().GetPeerToPeerFifoEndpoint(fpgaSession_, fifo_, &endpoint));
  return endpoint;
}

}  // namespace ktisl
