#include "ktifw_lib_client/refusedMemory.h"

#include <cstdlib>
#include <new>

// Not inlined, or the compiler takes the free() for a mismatch with new.
[[gnu::noinline]] void* operator new(std::size_t size) {
  void* const memory = refuseMemory ? nullptr : std::malloc(size);
  return memory != nullptr ? memory : throw std::bad_alloc();
}
[[gnu::noinline]] void operator delete(void* memory) noexcept { std::free(memory); }
[[gnu::noinline]] void operator delete(void* memory, std::size_t) noexcept { std::free(memory); }
