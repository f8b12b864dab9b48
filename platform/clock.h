// The monotonic clock that deadlines are counted on. Any thread may read it.
#pragma once

#include <cstdint>

namespace platform {

// Milliseconds since some fixed moment; never runs backwards.
std::uint64_t monotonicMilliseconds();

}  // namespace platform
