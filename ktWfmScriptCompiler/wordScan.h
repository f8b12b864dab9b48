// Words of a text, eight bytes at a time: where a word ends, and the number that stands for a short one. Eight bytes
// of the text stand in a std::uint64_t, the first in its lowest byte. Internal to the compiler.
#pragma once

#include <bit>
#include <cstdint>
#include <cstring>

namespace ktwfmscriptcompiler {

static_assert(std::endian::native == std::endian::little);

inline constexpr std::size_t kScanBytes = sizeof(std::uint64_t);
inline constexpr std::uint64_t kEachByte = 0x0101010101010101;
inline constexpr std::uint64_t kHighBits = kEachByte * 0x80;

inline std::uint64_t loadBytes(const char* bytes) {
  std::uint64_t loaded = 0;
  std::memcpy(&loaded, bytes, kScanBytes);
  return loaded;
}

// All ones in the first `count` bytes, 1 to kScanBytes.
constexpr std::uint64_t firstBytes(std::size_t count) { return ~std::uint64_t{0} >> (8 * (kScanBytes - count)); }

// The high bit of each byte that is at least `least`; for bytes below 0x80.
constexpr std::uint64_t atLeast(std::uint64_t bytes, int least) {
  return bytes + kEachByte * static_cast<unsigned>(0x80 - least);
}

// Makes letters small. Other bytes change too, but no ASCII letter or digit becomes another one's equal.
constexpr std::uint64_t foldWordBytes(std::uint64_t bytes) { return bytes | kEachByte * 0x20; }

// How many of the bytes, from the first on, stand in a word: letters, digits and what is not ASCII.
constexpr std::size_t countWordBytes(std::uint64_t bytes) {
  const std::uint64_t ascii = bytes & ~kHighBits;
  const std::uint64_t folded = foldWordBytes(ascii);
  const std::uint64_t letters = atLeast(folded, 'a') & ~atLeast(folded, 'z' + 1);
  const std::uint64_t digits = atLeast(ascii, '0') & ~atLeast(ascii, '9' + 1);
  const std::uint64_t others = ~(letters | digits | bytes) & kHighBits;
  return static_cast<std::size_t>(std::countr_zero(others)) / 8;
}

// The first byte that stands in no word, from `place` on; kScanBytes may be read behind it.
inline const char* endOfWord(const char* place) {
  for (;;) {
    const std::size_t count = countWordBytes(loadBytes(place));
    place += count;
    if (count < kScanBytes) return place;
  }
}

}  // namespace ktwfmscriptcompiler
