// The allocator as its rules are worded, walking over all free blocks: the model that the real one is compared with,
// step by step in its test and in speed in benchmarks/allocator.
#pragma once

#include <map>

#include "ktorba/waveform/MemoryBlockManager.h"

namespace ktorba {

class WalkingMemoryBlockManager : public MemoryBlockManagerInterface {
 public:
  WalkingMemoryBlockManager(std::uint32_t totalSize, std::uint32_t granularity)
      : usable_(totalSize / granularity * granularity), granularity_(granularity) {
    freeAllBlocks();
  }

  std::uint32_t getLargestAvailableBlockSize() const override { return largest.size; }
  std::uint32_t getBlockGranularity() const override { return granularity_; }

  std::uint32_t allocateBlock(std::uint32_t size) override {
    const MemoryBlock* best = nullptr;
    for (const auto& [start, block] : freeBlocks) {
      if (block.size >= size && (best == nullptr || block.size <= best->size)) best = &block;
    }
    const MemoryBlock chosen = *best;
    allocatedBlocks[chosen.start] = {chosen.start, size};
    const bool wasLargest = chosen.start == largest.start;
    freeBlocks.erase(chosen.start);
    if (size < chosen.size) freeBlocks[chosen.start + size] = {chosen.start + size, chosen.size - size};
    if (wasLargest) rescan();
    return chosen.start;
  }

  void freeBlock(std::uint32_t start) override {
    MemoryBlock joined = allocatedBlocks.at(start);
    allocatedBlocks.erase(start);
    const auto after = freeBlocks.lower_bound(start);
    const auto before = after == freeBlocks.begin() ? freeBlocks.end() : std::prev(after);
    if (after != freeBlocks.end() && after->first == start + joined.size) {
      joined.size += after->second.size;
      freeBlocks.erase(after);
    }
    if (before != freeBlocks.end() && before->first + before->second.size == start) {
      joined = {before->first, before->second.size + joined.size};
    }
    freeBlocks[joined.start] = joined;
    noteGrown(joined);
  }

  void freeAllBlocks() override {
    allocatedBlocks.clear();
    freeBlocks = {{0, {0, usable_}}};
    largest = {0, usable_};
  }

  MemoryBlock largest;
  std::map<std::uint32_t, MemoryBlock> freeBlocks;
  std::map<std::uint32_t, MemoryBlock> allocatedBlocks;

 private:
  void rescan() {
    largest = {};
    for (const auto& [start, block] : freeBlocks) noteGrown(block);
  }
  void noteGrown(const MemoryBlock& block) {
    if (block.size > largest.size) largest = block;
  }

  std::uint32_t usable_;
  std::uint32_t granularity_;
};

}  // namespace ktorba
