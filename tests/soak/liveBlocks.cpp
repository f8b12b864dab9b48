// Apart from its users, so that compilers do not see through the operators and pair malloc with delete.
#include "liveBlocks.h"

#include <algorithm>
#include <atomic>
#include <cstdlib>
#include <new>

namespace {

std::atomic<std::int64_t> count{0};

}  // namespace

std::int64_t soak::liveBlocks() { return count; }

void* operator new(std::size_t bytes) {
  void* const block = std::malloc(std::max<std::size_t>(bytes, 1));
  if (block == nullptr) throw std::bad_alloc();
  ++count;
  return block;
}

void operator delete(void* block) noexcept {
  if (block != nullptr) --count;
  std::free(block);
}

void operator delete(void* block, std::size_t) noexcept { operator delete(block); }
