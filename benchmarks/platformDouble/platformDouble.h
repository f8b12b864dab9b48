// Platform libraries that return at once, to measure what this library adds to them. The framework holds a tree of
// contexts in which all generators are the same one, ready and done; the FPGA's FIFO is a buffer that is always empty.
// Not for several threads.
#pragma once

#include <cstdint>

extern "C" {

// Calls made to both libraries since the process began.
std::uint64_t ktDouble_fpgaCalls();
std::uint64_t ktDouble_frameworkCalls();

// Where the data of FIFO writes is expected, and how many bytes have come from elsewhere since.
void ktDouble_expectData(const void* data, std::uint64_t count);
std::uint64_t ktDouble_bytesFromElsewhere();

// Contexts of the framework, each with up to 10 children; 2 at first, of which the second is the generator.
void ktDouble_setContexts(std::uint32_t count);
}

inline std::uint64_t platformCalls() { return ktDouble_fpgaCalls() + ktDouble_frameworkCalls(); }
