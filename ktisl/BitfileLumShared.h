// The bitfile behind an FPGA session that the host has opened. Holds the session's handle without owning it; no state
// changes after construction, so any thread may look resources up.
#pragma once

#include <array>
#include <cstdint>

#include "ktisl/BitfileInterface.h"

namespace ktisl {

class BitfileLumShared : public BitfileInterface {
 public:
  // Reads the bitfile's signature. Raises -52 for a handle with bit 0x2000 set, before any call to the FPGA, and the
  // FPGA interface library's errors.
  explicit BitfileLumShared(std::uint32_t fpgaSession);

  // Kinds 36 to 71 are DMA FIFOs, all others registers.
  std::uint32_t findResource(const char* resourceName, std::int32_t resourceKind) override;

  // The number of the DMA FIFO of that name; raises the library's error when there is none.
  std::uint32_t findFifo(const char* name) const;

 private:
  std::uint32_t findRegister(const char* name) const;

  std::array<std::uint32_t, 4> signature_{};  // 128 bits
  std::uint32_t fpgaSession_;
};

}  // namespace ktisl
