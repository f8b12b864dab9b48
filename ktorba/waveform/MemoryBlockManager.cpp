#include "ktorba/waveform/MemoryBlockManager.h"

#include <utility>

#include "kterr/Failure.h"
#include "ktorba/waveform/ScopeExitCleanupOperation.h"

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
  const MemoryBlock rest{block.start + size, block.size - size};
  // What may fail for want of memory comes first, and is undone when a later step fails.
  if (rest.size > 0) addFree(rest);
  ScopeExitCleanupOperation undo([&] {
    if (rest.size > 0) removeFree(rest);
  });
  allocatedByStart_.insert(startKey({block.start, size}));
  undo.dismiss();
  removeFree(block);
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
  const MemoryBlock block = blockOfStartKey(*allocated);
  const std::optional<MemoryBlock> front = freeBlockBefore(start);
  const std::optional<MemoryBlock> back = freeBlockAt(endOf(block));
  const MemoryBlock joined{front ? front->start : start,
                           block.size + (front ? front->size : 0) + (back ? back->size : 0)};
  addFree(joined);  // alone may fail for want of memory
  allocatedByStart_.erase(*allocated);
  if (front) removeFree(*front);
  if (back) removeFree(*back);
  if (joined.size > largestFreeBlock_.size) largestFreeBlock_ = joined;
}

void MemoryBlockManager::freeAllBlocks() {
  const MemoryBlock whole{0, totalSize_ / granularity_ * granularity_};
  SortedKeys byStart, bySize;
  if (whole.size > 0) {
    byStart.insert(startKey(whole));
    bySize.insert(sizeKey(whole));
  }
  freeByStart_ = std::move(byStart);
  freeBySize_ = std::move(bySize);
  allocatedByStart_.clear();
  largestFreeBlock_ = whole;
}

void MemoryBlockManager::addFree(const MemoryBlock& block) {
  freeByStart_.insert(startKey(block));
  ScopeExitCleanupOperation undo([&] { freeByStart_.erase(startKey(block)); });
  freeBySize_.insert(sizeKey(block));
  undo.dismiss();
}

void MemoryBlockManager::removeFree(const MemoryBlock& block) {
  freeByStart_.erase(startKey(block));
  freeBySize_.erase(sizeKey(block));
}

std::optional<MemoryBlock> MemoryBlockManager::freeBlockBefore(std::uint32_t start) const {
  const auto key = freeByStart_.below(startKey({start, 0}));
  if (!key || endOf(blockOfStartKey(*key)) != start) return std::nullopt;
  return blockOfStartKey(*key);
}

std::optional<MemoryBlock> MemoryBlockManager::freeBlockAt(std::uint32_t start) const {
  const auto key = freeByStart_.atOrAbove(startKey({start, 0}));
  if (!key || blockOfStartKey(*key).start != start) return std::nullopt;
  return blockOfStartKey(*key);
}

}  // namespace ktorba
