// Divides the generator's sample memory, a linear space of bytes counted from 0, into blocks. One thread at a time.
#pragma once

#include <cstdint>

namespace ktorba {

class MemoryBlockManagerInterface {
 public:
  virtual ~MemoryBlockManagerInterface() = default;
  // Bytes; 0 when nothing is free.
  virtual std::uint32_t getLargestAvailableBlockSize() const = 0;
  // Bytes of one memory word; requests are multiples of it.
  virtual std::uint32_t getBlockGranularity() const = 0;
  // Hands out exactly `size` bytes and returns their start. `size` is 1 to getLargestAvailableBlockSize().
  virtual std::uint32_t allocateBlock(std::uint32_t size) = 0;
  // Takes the block back that allocateBlock() returned as `start`.
  virtual void freeBlock(std::uint32_t start) = 0;
  // Forgets every allocation.
  virtual void freeAllBlocks() = 0;
};

}  // namespace ktorba
