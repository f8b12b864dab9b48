#include "ktcheckname/compareNames.h"

#include <algorithm>
#include <cstring>

#include "ktcheckname/caseFolding.h"

namespace ktcheckname {
namespace {

bool isAscii(char c) { return static_cast<unsigned char>(c) < 0x80; }

char foldAscii(char c) { return c >= 'A' && c <= 'Z' ? static_cast<char>(c + ('a' - 'A')) : c; }

// Eight bytes of a name at a time, one in each byte of a word.
constexpr std::uint64_t kEachByte = 0x0101010101010101;
constexpr std::uint64_t kHighBits = kEachByte * 0x80;

std::uint64_t loadEight(const char* bytes) {
  std::uint64_t word = 0;
  std::memcpy(&word, bytes, sizeof word);
  return word;
}

// Folds eight ASCII bytes: the sums reach the high bit of each byte from 'A' on and from behind 'Z' on, so a capital
// is where they differ; its bit 0x20 makes it small.
std::uint64_t foldEightAscii(std::uint64_t bytes) {
  const std::uint64_t fromA = bytes + kEachByte * (0x80 - 'A');
  const std::uint64_t behindZ = bytes + kEachByte * (0x80 - 'Z' - 1);
  return bytes | ((fromA ^ behindZ) & kHighBits) >> 2;
}

bool sameEightAscii(std::uint64_t a, std::uint64_t b) {
  return ((a | b) & kHighBits) == 0 && foldEightAscii(a) == foldEightAscii(b);
}

// Gives the folded code points of a name one by one.
class FoldedReader {
 public:
  explicit FoldedReader(std::string_view name) : position_(name.data()), end_(name.data() + name.size()) {}

  // Returns the next one, or -1, which orders before all of them, behind the last.
  std::int32_t next() {
    if (used_ == folded_.count) {
      if (position_ == end_) return -1;
      folded_ = foldCase(decodeUtf8(position_, end_));
      used_ = 0;
    }
    return static_cast<std::int32_t>(folded_.codePoints[used_++]);
  }

 private:
  const char* position_;
  const char* end_;
  FoldedCase folded_{};
  std::uint8_t used_ = 0;
};

int compareFolded(FoldedReader a, FoldedReader b) {
  for (;;) {
    const std::int32_t left = a.next();
    const std::int32_t right = b.next();
    if (left != right) return left < right ? -1 : 1;
    if (left == -1) return 0;
  }
}

// Bytes of the sequence that `first` opens; 1 for bytes that open none.
int sequenceLength(unsigned char first) {
  if (first >= 0xC0 && first < 0xE0) return 2;
  if (first >= 0xE0 && first < 0xF0) return 3;
  if (first >= 0xF0 && first < 0xF8) return 4;
  return 1;
}

}  // namespace

std::uint32_t decodeUtf8(const char*& position, const char* end) {
  const auto first = static_cast<unsigned char>(*position++);
  const int length = sequenceLength(first);
  // A sequence cut short by the end is read byte by byte.
  if (length == 1 || end - position < length - 1) return first;
  std::uint32_t codePoint = first & (0x7Fu >> length);
  for (int i = 1; i < length; ++i) codePoint = codePoint << 6 | (static_cast<unsigned char>(*position++) & 0x3Fu);
  return codePoint;
}

int compareNames(std::string_view a, std::string_view b) {
  if (a == b) return 0;
  // Most names are plain ASCII, whose letters fold byte by byte: no code points up to the first other byte.
  const std::size_t common = std::min(a.size(), b.size());
  std::size_t i = 0;
  while (common - i >= 8 && sameEightAscii(loadEight(&a[i]), loadEight(&b[i]))) i += 8;
  for (; i < common && isAscii(a[i]) && isAscii(b[i]); ++i) {
    const char left = foldAscii(a[i]);
    const char right = foldAscii(b[i]);
    if (left != right) return left < right ? -1 : 1;
  }
  return compareFolded(FoldedReader(a.substr(i)), FoldedReader(b.substr(i)));
}

}  // namespace ktcheckname
