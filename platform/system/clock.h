// The monotonic clock that deadlines are counted on. Any thread may read it.
#pragma once

#include <cstdint>

namespace platform {

// Milliseconds since some fixed moment; never runs backwards.
std::uint64_t monotonicMilliseconds();

// Changes with every tick of the system's timer, some 60 to 1000 times a second. Costs a fraction of reading the clock,
// which waits for the memory accesses before it.
std::uint64_t monotonicTick();

}  // namespace platform
