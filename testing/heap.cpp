#include "testing/heap.h"

#include <algorithm>
#include <cstdlib>
#include <new>

namespace {

bool mustRefuse() {
  if (heap::isRefusing) return true;
  return heap::isCounting && heap::refusedRequest > 0 && --heap::refusedRequest == 0;
}

}  // namespace

// All forms, since sanitizers do not make the ones from the others. Not inlined, or the compiler takes the free() for a
// mismatch with new.
[[gnu::noinline]] void* operator new(std::size_t size, const std::nothrow_t&) noexcept {
  void* const memory = mustRefuse() ? nullptr : std::malloc(std::max<std::size_t>(size, 1));
  if (memory != nullptr) ++heap::liveBlocks;
  return memory;
}
[[gnu::noinline]] void* operator new(std::size_t size) {
  void* const memory = operator new(size, std::nothrow);
  return memory != nullptr ? memory : throw std::bad_alloc();
}
void* operator new[](std::size_t size) { return operator new(size); }
void* operator new[](std::size_t size, const std::nothrow_t&) noexcept { return operator new(size, std::nothrow); }
[[gnu::noinline]] void operator delete(void* memory) noexcept {
  if (memory != nullptr) --heap::liveBlocks;
  std::free(memory);
}
void operator delete(void* memory, std::size_t) noexcept { operator delete(memory); }
void operator delete[](void* memory) noexcept { operator delete(memory); }
void operator delete[](void* memory, std::size_t) noexcept { operator delete(memory); }
