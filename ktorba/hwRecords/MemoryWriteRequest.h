// One announced transfer into sample or sequence memory: the first five fields are written to the generator's
// registers (ktorba/commandControl), the others tell the download manager what to send.
#pragma once

#include <cstdint>

namespace ktorba {

struct MemoryWriteRequest {
  std::uint32_t memoryAddress = 0;     // byte address of the first memory word written, aligned to a memory word
  std::uint32_t transferElements = 0;  // whole transfer, padding included, in download elements
  std::uint8_t maskedWrite = 0;        // 1: the byte masks apply; 0: whole words (sequence memory)
  std::uint64_t firstWordByteMask = ~std::uint64_t{0};  // bit n: byte n of the first memory word is written
  std::uint64_t lastWordByteMask = ~std::uint64_t{0};   // the same for the last memory word
  std::uint64_t byteCount = 0;                          // bytes taken from the caller's data
  std::uint64_t dataOffset = 0;                         // where in the caller's data they begin, bytes
  std::uint64_t leadPadBytes = 0;                       // zero bytes sent before the data
  std::uint64_t trailPadBytes = 0;                      // zero bytes sent after the data
  std::uint64_t maxChunkBytes = 0;                      // most data bytes handed to the FIFO in one call
};

}  // namespace ktorba
