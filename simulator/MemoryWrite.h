// One announced memory write: the bytes that come through the FIFO, put where the announcement says. Guarded by its
// FPGA's lock.
#pragma once

#include <cstdint>

namespace simulator {

class MemoryWrite {
 public:
  struct Announcement {
    std::uint8_t* memory;  // null: the bytes are swallowed
    std::uint64_t byteCount;
    std::uint32_t wordBytes;  // 1 to 64
    // Bit n: byte n of the first, of the last memory word is written. Both hold for a write of one word.
    std::uint64_t firstWordMask;
    std::uint64_t lastWordMask;
  };

  // A run of bytes that has arrived, from the write's start.
  struct Arrival {
    std::uint64_t offset;
    std::uint64_t count;
  };

  void begin(const Announcement& announcement);
  void cancel() { bytesMissing_ = 0; }
  bool isInProgress() const { return bytesMissing_ != 0; }
  std::uint64_t bytesMissing() const { return bytesMissing_; }
  // At most bytesMissing() bytes.
  Arrival take(const std::uint8_t* bytes, std::uint64_t count);

 private:
  bool isEnabled(std::uint64_t offset) const;

  Announcement announced_{};
  std::uint64_t lastWordOffset_ = 0;
  std::uint64_t bytesMissing_ = 0;
};

}  // namespace simulator
