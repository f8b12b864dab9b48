// Divides the generator's sample memory, a linear space of bytes counted from 0, into blocks. One thread at a time.
//
// A request that breaks its precondition raises nKTAPALS100_tStatus_kSoftwareFault and changes nothing, as does an
// operation that finds no memory of the host for its records.
#pragma once

#include <cstdint>

namespace ktorba {

class MemoryBlockManagerInterface {
 public:
  virtual ~MemoryBlockManagerInterface() = default;

  // Returns the most bytes that can be handed out in one block; 0 when nothing is free.
  virtual std::uint32_t getLargestAvailableBlockSize() const = 0;

  // Returns the bytes of one memory word; requests are multiples of it.
  virtual std::uint32_t getBlockGranularity() const = 0;

  // Hands out exactly `size` bytes and returns their start. `size` must be 1 to getLargestAvailableBlockSize().
  virtual std::uint32_t allocateBlock(std::uint32_t size) = 0;

  // Takes the block back that allocateBlock() returned as `start`.
  virtual void freeBlock(std::uint32_t start) = 0;

  // Forgets every allocation.
  virtual void freeAllBlocks() = 0;
};

}  // namespace ktorba
