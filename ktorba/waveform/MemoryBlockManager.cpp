#include "ktorba/waveform/MemoryBlockManager.h"

#include <iterator>
#include <limits>

#include "kterr/Failure.h"

namespace ktorba {
namespace {

constexpr char kSource[] = R"(includes\ktorba\waveform\MemoryBlockManager)";
constexpr std::uint32_t kHighestStart = std::numeric_limits<std::uint32_t>::max();

[[noreturn]] void raiseSoftwareFault(const char* function, const char* text) {
  kterr::Failure(nKTAPALS100_tStatus_kSoftwareFault).at(kSource).message(function, text).raise();
}

bool areAdjacent(const MemoryBlock& front, const MemoryBlock& back) { return front.start + front.size == back.start; }

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
  auto& bySize = freeBlocks_.get<BySize>();
  const auto best = bySize.lower_bound(MemoryBlock{kHighestStart, size});
  const MemoryBlock block = *best;
  allocatedBlocks_.emplace(block.start, MemoryBlock{block.start, size});
  if (size < block.size) {
    bySize.modify(best, [size](MemoryBlock& rest) { rest = {rest.start + size, rest.size - size}; });
  } else {
    bySize.erase(best);
  }
  if (block.start == largestFreeBlock_.start) largestFreeBlock_ = bySize.empty() ? MemoryBlock{} : *bySize.rbegin();
  return block.start;
}

void MemoryBlockManager::freeBlock(std::uint32_t start) {
  const auto allocated = allocatedBlocks_.find(start);
  if (allocated == allocatedBlocks_.end()) {
    raiseSoftwareFault("ktorba::MemoryBlockManager::freeBlock", "no block starts there");
  }
  auto& byStart = freeBlocks_.get<ByStart>();
  auto block = byStart.insert(allocated->second).first;
  allocatedBlocks_.erase(allocated);
  // A memory without a free block holds {0, 0}, so the only free block is always larger.
  if (block->size > largestFreeBlock_.size) largestFreeBlock_ = *block;
  if (block != byStart.begin() && areAdjacent(*std::prev(block), *block)) block = join(std::prev(block), block);
  const auto next = std::next(block);
  if (next != byStart.end() && areAdjacent(*block, *next)) join(block, next);
}

void MemoryBlockManager::freeAllBlocks() {
  freeBlocks_.clear();
  allocatedBlocks_.clear();
  largestFreeBlock_ = {0, totalSize_ / granularity_ * granularity_};
  if (largestFreeBlock_.size > 0) freeBlocks_.insert(largestFreeBlock_);
}

// The joined block is larger than its parts, so the record of the largest never names one of them afterwards.
MemoryBlockManager::FreePosition MemoryBlockManager::join(FreePosition front, FreePosition back) {
  auto& byStart = freeBlocks_.get<ByStart>();
  const MemoryBlock joined{front->start, front->size + back->size};
  byStart.erase(back);
  byStart.replace(front, joined);
  if (joined.size > largestFreeBlock_.size) largestFreeBlock_ = joined;
  return front;
}

}  // namespace ktorba
