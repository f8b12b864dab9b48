#include "simulator/MemoryWrite.h"

#include <algorithm>
#include <cstring>

namespace simulator {

void MemoryWrite::begin(const Announcement& announcement) {
  announced_ = announcement;
  bytesMissing_ = announcement.byteCount;
  const std::uint64_t lastByte = announcement.byteCount == 0 ? 0 : announcement.byteCount - 1;
  lastWordOffset_ = lastByte - lastByte % announcement.wordBytes;
}

bool MemoryWrite::isEnabled(std::uint64_t offset) const {
  const std::uint64_t bit = std::uint64_t{1} << (offset % announced_.wordBytes);
  return (offset >= announced_.wordBytes || (announced_.firstWordMask & bit) != 0) &&
         (offset < lastWordOffset_ || (announced_.lastWordMask & bit) != 0);
}

MemoryWrite::Arrival MemoryWrite::take(const std::uint8_t* bytes, std::uint64_t count) {
  const Arrival arrival{announced_.byteCount - bytesMissing_, count};
  bytesMissing_ -= count;
  if (announced_.memory == nullptr) return arrival;
  const std::uint64_t end = arrival.offset + count;
  std::uint64_t at = arrival.offset;
  const auto copyEnabled = [&](std::uint64_t until) {
    for (; at < until; ++at) {
      if (isEnabled(at)) announced_.memory[at] = bytes[at - arrival.offset];
    }
  };
  copyEnabled(std::min<std::uint64_t>(end, announced_.wordBytes));
  if (const std::uint64_t wholeEnd = std::min(end, lastWordOffset_); at < wholeEnd) {
    std::memcpy(announced_.memory + at, bytes + (at - arrival.offset), wholeEnd - at);
    at = wholeEnd;
  }
  copyEnabled(end);
  return arrival;
}

}  // namespace simulator
