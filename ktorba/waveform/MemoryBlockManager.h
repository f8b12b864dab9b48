// The allocator of the generator's sample memory: best fit over a linear space of bytes, every block found in
// logarithmic time. It aligns nothing itself; since callers ask for whole memory words, every block starts on
// one. See MemoryBlockManagerInterface.h for its operations. One thread at a time.
#pragma once

#include "ktorba/waveform/MemoryBlockManagerInterface.h"
#include "ktorba/waveform/SortedKeys.h"

namespace ktorba {

// Bytes.
struct MemoryBlock {
  std::uint32_t start = 0;
  std::uint32_t size = 0;

  bool operator==(const MemoryBlock&) const = default;
};

class MemoryBlockManager : public MemoryBlockManagerInterface {
 public:
  // All of the memory is free. Bytes above the last whole multiple of `granularity` are never handed out; 0 raises
  // nKTAPALS100_tStatus_kSoftwareFault.
  MemoryBlockManager(std::uint32_t totalSize, std::uint32_t granularity);

  std::uint32_t getLargestAvailableBlockSize() const override;
  std::uint32_t getBlockGranularity() const override;

  // Takes the front of the smallest free block that is large enough; of several, of the one that starts highest.
  std::uint32_t allocateBlock(std::uint32_t size) override;

  // Joins the block with the free blocks beside it.
  void freeBlock(std::uint32_t start) override;
  void freeAllBlocks() override;

  // The free block behind getLargestAvailableBlockSize(), {0, 0} when nothing is free.
  const MemoryBlock& getLargestFreeBlock() const { return largestFreeBlock_; }

 private:
  void addFree(const MemoryBlock& block);
  void removeFree(const MemoryBlock& block);
  std::optional<MemoryBlock> freeBlockBefore(std::uint32_t start) const;  // that ends at `start`
  std::optional<MemoryBlock> freeBlockAt(std::uint32_t start) const;

  std::uint32_t totalSize_;
  std::uint32_t granularity_;
  MemoryBlock largestFreeBlock_;  // of several equally large ones, any
  SortedKeys freeByStart_;        // no two adjacent
  SortedKeys freeBySize_;         // the same blocks
  SortedKeys allocatedByStart_;
};

}  // namespace ktorba
