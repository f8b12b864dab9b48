// A double of the FPGA interface library: a shared library of its name, which the library under test finds loaded. Its
// FIFO is a buffer that is always empty. A call returns at once and takes no memory. Not for several threads.
#pragma once

#include <cstdint>

struct FpgaDouble {
  std::uint64_t callCount = 0;

  // Where the data of FIFO writes is expected, and how many bytes came from elsewhere.
  const void* expectedData = nullptr;
  std::uint64_t expectedCount = 0;
  std::uint64_t bytesFromElsewhere = 0;
};

// The one of this process.
FpgaDouble& fpgaDouble();
