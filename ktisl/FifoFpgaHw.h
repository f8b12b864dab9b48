// A DMA FIFO of the FPGA, reached through the FPGA interface library; see Fifo.h for what its operations do. Holds
// the FPGA session's handle and the FIFO's number without owning either: destroying it leaves the FIFO as it is.
// The operations raise only when the library itself, or the function they need, is missing.
#pragma once

#include <cstdint>

#include "ktisl/Fifo.h"

namespace ktisl {

template <typename Element>
class FifoFpgaHw;

template <>
class FifoFpgaHw<unsigned char> : public Fifo<unsigned char> {
 public:
  FifoFpgaHw(std::uint32_t fpgaSession, std::uint32_t fifo) : fpgaSession_(fpgaSession), fifo_(fifo) {}

  void read(unsigned char* buffer, std::uint64_t count, std::uint32_t timeoutMs, std::uint64_t& elementsRemaining,
            Status& status) override;
  void write(const unsigned char* data, std::uint64_t count, std::uint32_t timeoutMs,
             std::uint64_t& emptyElementsRemaining, Status& status) override;
  void configure(std::uint64_t requestedDepth, std::uint64_t& actualDepth, Status& status) override;
  void restart(Status& status) override;
  void start(Status& status) override;
  void stop(Status& status) override;
  void acquireReadElements(unsigned char*& elements, std::uint64_t count, std::uint32_t timeoutMs,
                           std::uint64_t& acquired, std::uint64_t& remaining, Status& status) override;
  void acquireWriteElements(unsigned char*& elements, std::uint64_t count, std::uint32_t timeoutMs,
                            std::uint64_t& acquired, std::uint64_t& remaining, Status& status) override;
  void releaseElements(std::uint64_t count, Status& status) override;
  std::uint32_t getPeerToPeerEndpoint(Status& status) override;

 private:
  std::uint32_t fpgaSession_;
  std::uint32_t fifo_;
};

}  // namespace ktisl
