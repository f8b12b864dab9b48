#include "ktorba/waveform/MemoryBlockManager.h"

#include "kterr/Failure.h"

namespace ktorba {
namespace {

constexpr char kSource[] = R"(includes\ktorba\waveform\MemoryBlockManager)";

[[noreturn]] void raiseSoftwareFault(const char* function, const char* text) {
  kterr::Failure(nKTAPALS100_tStatus_kSoftwareFault).at(kSource).message(function, text).raise();
}

using Key = SortedKeys::Key;

// Blocks in the order of their starts.
Key startKey(const MemoryBlock& block) { return Key{block.start} << 32 | block.size; }
MemoryBlock blockOfStartKey(Key key) {
  return {static_cast<std::uint32_t>(key >> 32), static_cast<std::uint32_t>(key)};
}

// Blocks in the order of their sizes, equally large ones from the highest to the lowest: the first that is not smaller
// than a request is the one to take, the last of all is the largest and the lowest of that size.
Key sizeKey(const MemoryBlock& block) { return Key{block.size} << 32 | ~block.start; }
MemoryBlock blockOfSizeKey(Key key) {
  return {~static_cast<std::uint32_t>(key), static_cast<std::uint32_t>(key >> 32)};
}

std::uint32_t endOf(const MemoryBlock& block) { return block.start + block.size; }

}  // namespace

MemoryBlockManager::MemoryBlockManager(std::uint32_t totalSize, std::uint32_t granularity)
    : totalSize_(totalSize), granularity_(granularity) {
  if (granularity_ == 0) raiseSoftwareFault("ktorba::MemoryBlockManager::MemoryBlockManager", "granularity is 0");
  freeAllBlocks();
}

std::uint32_t MemoryBlockManager::getLargestAvailableBlockSize() const { return largestFreeBlock_.size; }

std::uint32_t MemoryBlockManager::getBlockGranularity() const { return granularity_; }

std::uint32_t MemoryBlockManager::allocateBlock(std::uint32_t size) {
  if (size == 0 || size > largestFreeBlock_.size) {
    raiseSoftwareFault("ktorba::MemoryBlockManager::allocateBlock", "no free block of this size");
  }
  const MemoryBlock block = blockOfSizeKey(*freeBySize_.atOrAbove(Key{size} << 32));
  allocatedByStart_.insert(startKey({block.start, size}));
  removeFree(block);
  if (size < block.size) addFree({block.start + size, block.size - size});
  if (block.start == largestFreeBlock_.start) {
    const auto largest = freeBySize_.highest();
    largestFreeBlock_ = largest ? blockOfSizeKey(*largest) : MemoryBlock{};
  }
  return block.start;
}

void MemoryBlockManager::freeBlock(std::uint32_t start) {
  const auto allocated = allocatedByStart_.atOrAbove(startKey({start, 0}));
  if (!allocated || blockOfStartKey(*allocated).start != start) {
    raiseSoftwareFault("ktorba::MemoryBlockManager::freeBlock", "no block starts there");
  }
  MemoryBlock block = blockOfStartKey(*allocated);
  allocatedByStart_.erase(*allocated);
  // Which of several equally large blocks the record names depends on noting every step.
  noteGrown(block);
  if (const auto front = freeBlockBefore(start); front && endOf(*front) == start) {
    removeFree(*front);
    block = {front->start, front->size + block.size};
    noteGrown(block);
  }
  if (const auto back = freeBlockAt(endOf(block))) {
    removeFree(*back);
    block.size += back->size;
    noteGrown(block);
  }
  addFree(block);
}

void MemoryBlockManager::freeAllBlocks() {
  freeByStart_.clear();
  freeBySize_.clear();
  allocatedByStart_.clear();
  largestFreeBlock_ = {0, totalSize_ / granularity_ * granularity_};
  if (largestFreeBlock_.size > 0) addFree(largestFreeBlock_);
}

void MemoryBlockManager::addFree(const MemoryBlock& block) {
  freeByStart_.insert(startKey(block));
  freeBySize_.insert(sizeKey(block));
}

void MemoryBlockManager::removeFree(const MemoryBlock& block) {
  freeByStart_.erase(startKey(block));
  freeBySize_.erase(sizeKey(block));
}

std::optional<MemoryBlock> MemoryBlockManager::freeBlockBefore(std::uint32_t start) const {
  const auto key = freeByStart_.below(startKey({start, 0}));
  return key ? std::optional(blockOfStartKey(*key)) : std::nullopt;
}

std::optional<MemoryBlock> MemoryBlockManager::freeBlockAt(std::uint32_t start) const {
  const auto key = freeByStart_.atOrAbove(startKey({start, 0}));
  if (!key || blockOfStartKey(*key).start != start) return std::nullopt;
  return blockOfStartKey(*key);
}

void MemoryBlockManager::noteGrown(const MemoryBlock& block) {
  if (block.size > largestFreeBlock_.size) largestFreeBlock_ = block;
}

}  // namespace ktorba
