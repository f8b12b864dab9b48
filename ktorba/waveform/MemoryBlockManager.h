// The allocator of the generator's sample memory: best fit over a linear space of bytes, every operation logarithmic
// in the number of blocks. It aligns nothing itself; since callers ask for whole memory words, every block starts on
// one. One thread at a time.
//
// A request that breaks its precondition (no free block large enough, size 0, a start that is not allocated,
// granularity 0) raises nKTAPALS100_tStatus_kSoftwareFault and changes nothing.
#pragma once

#include <boost/multi_index/identity.hpp>
#include <boost/multi_index/member.hpp>
#include <boost/multi_index/ordered_index.hpp>
#include <boost/multi_index_container.hpp>
#include <map>

#include "ktorba/waveform/MemoryBlockManagerInterface.h"

namespace ktorba {

// Bytes.
struct MemoryBlock {
  std::uint32_t start = 0;
  std::uint32_t size = 0;

  bool operator==(const MemoryBlock&) const = default;
};

class MemoryBlockManager : public MemoryBlockManagerInterface {
 public:
  // All of the memory is free. Bytes above the last whole multiple of `granularity` are never handed out.
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
  // The first block not less than {0, size} is the one to allocate from; the last block is the largest, and of
  // several the lowest.
  struct BySizeThenHighStart {
    bool operator()(const MemoryBlock& a, const MemoryBlock& b) const {
      return a.size != b.size ? a.size < b.size : a.start > b.start;
    }
  };
  struct ByStart {};
  struct BySize {};
  using FreeBlocks = boost::multi_index_container<
      MemoryBlock,
      boost::multi_index::indexed_by<
          boost::multi_index::ordered_unique<
              boost::multi_index::tag<ByStart>,
              boost::multi_index::member<MemoryBlock, std::uint32_t, &MemoryBlock::start>>,
          boost::multi_index::ordered_unique<boost::multi_index::tag<BySize>, boost::multi_index::identity<MemoryBlock>,
                                             BySizeThenHighStart>>>;
  using FreePosition = FreeBlocks::index<ByStart>::type::iterator;

  FreePosition join(FreePosition front, FreePosition back);

  std::uint32_t totalSize_;
  std::uint32_t granularity_;
  MemoryBlock largestFreeBlock_;                          // of several equally large ones, any
  FreeBlocks freeBlocks_;                                 // no two adjacent
  std::map<std::uint32_t, MemoryBlock> allocatedBlocks_;  // by start
};

}  // namespace ktorba
