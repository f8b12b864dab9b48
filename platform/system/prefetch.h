// A hint to the processor, for loops that are limited by the memory they fill. Any thread may give it.
#pragma once

#include <cstddef>

namespace platform {

// Calls `bytes` bytes, soon to be written, into the first cache: some KiB at a time, well within its size. Only ever a
// matter of speed; does nothing where the compiler knows no such hint.
inline void prefetchForWriting([[maybe_unused]] const void* memory, [[maybe_unused]] std::size_t bytes) {
#ifdef __GNUC__
  constexpr std::size_t kCacheLineBytes = 64;
  for (std::size_t line = 0; line < bytes; line += kCacheLineBytes) {
    __builtin_prefetch(static_cast<const std::byte*>(memory) + line, 1);
  }
  asm("");  // or GCC takes a function that only hints for one without effect, and leaves its calls out
#endif
}

}  // namespace platform
