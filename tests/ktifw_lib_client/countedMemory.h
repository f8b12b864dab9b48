// The heap of this test program, counted, and refused on demand.
#pragma once

#include <atomic>

inline std::atomic<int> allocations = 0;
inline std::atomic<bool> refuseMemory = false;
