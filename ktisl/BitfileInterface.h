// The FPGA design as its resources' names show it: what turns a name into the number that later calls use.
#pragma once

#include <cstdint>

namespace ktisl {

class BitfileInterface {
 public:
  virtual ~BitfileInterface() = default;

  // Returns the DMA FIFO's number, or the register's offset, for `resourceKind` in the numbering of the FPGA
  // interface library. Raises the library's error when there is no such resource.
  virtual std::uint32_t findResource(const char* resourceName, std::int32_t resourceKind) = 0;
};

}  // namespace ktisl
