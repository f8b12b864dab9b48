#include "cli/characters.h"

#include <algorithm>
#include <iterator>

namespace cli {
namespace {

constexpr char32_t kReplacement = 0xFFFD;

struct Form {
  unsigned char leadMask;
  unsigned char lead;
  std::size_t length;
  char32_t least;  // smaller values have a shorter form
};
constexpr Form kForms[] = {{0x80, 0x00, 1, 0}, {0xE0, 0xC0, 2, 0x80}, {0xF0, 0xE0, 3, 0x800}, {0xF8, 0xF0, 4, 0x10000}};

struct Range {
  char32_t first;
  char32_t last;
};
constexpr Range kZeroWidth[] = {{0x00, 0x1F},     {0x7F, 0x9F},     {0x300, 0x36F},   {0x483, 0x489},
                                {0x591, 0x5BD},   {0x610, 0x61A},   {0x64B, 0x65F},   {0x1AB0, 0x1AFF},
                                {0x1DC0, 0x1DFF}, {0x200B, 0x200F}, {0x20D0, 0x20FF}, {0xFE00, 0xFE0F},
                                {0xFE20, 0xFE2F}, {0xFEFF, 0xFEFF}};
constexpr Range kWide[] = {{0x1100, 0x115F},   {0x2E80, 0x303E},   {0x3041, 0x33FF},  {0x3400, 0x4DBF},
                           {0x4E00, 0xA4CF},   {0xA960, 0xA97C},   {0xAC00, 0xD7A3},  {0xF900, 0xFAFF},
                           {0xFE30, 0xFE6F},   {0xFF00, 0xFF60},   {0xFFE0, 0xFFE6},  {0x1F300, 0x1F64F},
                           {0x1F680, 0x1F6FF}, {0x1F900, 0x1F9FF}, {0x20000, 0x3FFFD}};

template <std::size_t size>
bool isIn(const Range (&ranges)[size], char32_t codePoint) {
  const auto after = std::upper_bound(std::begin(ranges), std::end(ranges), codePoint,
                                      [](char32_t value, const Range& range) { return value < range.first; });
  return after != std::begin(ranges) && codePoint <= std::prev(after)->last;
}

bool isSurrogate(char32_t codePoint) { return codePoint >= 0xD800 && codePoint <= 0xDFFF; }

}  // namespace

Utf8Character decodeCharacter(std::string_view text) {
  const auto byteAt = [text](std::size_t i) { return static_cast<unsigned char>(text[i]); };
  for (const Form& form : kForms) {
    if ((byteAt(0) & form.leadMask) != form.lead || text.size() < form.length) continue;
    char32_t codePoint = byteAt(0) & static_cast<unsigned char>(~form.leadMask);
    bool isValid = true;
    for (std::size_t i = 1; i < form.length; ++i) {
      isValid = isValid && (byteAt(i) & 0xC0) == 0x80;
      codePoint = codePoint << 6 | (byteAt(i) & 0x3F);
    }
    isValid = isValid && codePoint >= form.least && codePoint <= 0x10FFFF && !isSurrogate(codePoint);
    if (isValid) return {codePoint, form.length, true};
  }
  return {kReplacement, 1, false};
}

std::optional<std::size_t> findInvalidUtf8(std::string_view text) {
  for (std::size_t i = 0; i < text.size();) {
    const Utf8Character character = decodeCharacter(text.substr(i));
    if (!character.isValid) return i;
    i += character.length;
  }
  return std::nullopt;
}

std::string toValidUtf8(std::string_view text) {
  std::string valid;
  while (!text.empty()) {
    const Utf8Character character = decodeCharacter(text);
    valid += character.isValid ? text.substr(0, character.length) : std::string_view("\uFFFD");
    text.remove_prefix(character.length);
  }
  return valid;
}

int displayWidth(char32_t codePoint) {
  if (isIn(kZeroWidth, codePoint)) return 0;
  return isIn(kWide, codePoint) ? 2 : 1;
}

}  // namespace cli
