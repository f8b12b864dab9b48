#include "tools/text/characters.h"

#include <utf8.h>

#include <algorithm>
#include <iterator>

namespace tools {
namespace {

constexpr char32_t kReplacement = 0xFFFD;

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

bool isControl(char32_t codePoint) { return codePoint < 0x20 || (codePoint >= 0x7F && codePoint < 0xA0); }

// What is shown as it stands, as nearly all texts are.
bool isPlain(char c) { return c >= ' ' && c <= '~'; }

char32_t shownInstead(char32_t codePoint) {
  return codePoint != '\t' && isControl(codePoint) ? kReplacement : codePoint;
}

}  // namespace

std::optional<std::size_t> findInvalidUtf8(std::string_view text) {
  const auto invalid = utf8::find_invalid(text.begin(), text.end());
  if (invalid == text.end()) return std::nullopt;
  return static_cast<std::size_t>(invalid - text.begin());
}

std::string toValidUtf8(std::string_view text) {
  std::string valid;
  while (const auto invalid = findInvalidUtf8(text)) {
    valid.append(text.substr(0, *invalid)).append("\uFFFD");
    text.remove_prefix(*invalid + 1);
  }
  return valid.append(text);
}

Character decodeCharacter(std::string_view text) {
  const auto last = std::find_if(text.begin() + 1, text.end(), [](char c) { return !utf8::internal::is_trail(c); });
  const std::string_view first(text.begin(), last);
  if (!utf8::is_valid(first.begin(), first.end())) return {kReplacement, 1};
  auto place = first.begin();
  return {static_cast<char32_t>(utf8::unchecked::next(place)), first.size()};
}

std::u32string toCharacters(std::string_view text) { return utf8::utf8to32(toValidUtf8(text)); }

std::string toPrintable(std::string_view text) {
  if (std::ranges::all_of(text, isPlain)) return std::string(text);
  std::u32string characters = toCharacters(text);
  for (char32_t& character : characters) character = shownInstead(character);
  return utf8::utf32to8(characters);
}

std::string blanksFor(std::string_view text) {
  std::string blanks;
  for (const char32_t character : toCharacters(text)) {
    if (character == '\t') {
      blanks += '\t';
    } else {
      blanks.append(static_cast<std::size_t>(displayWidth(shownInstead(character))), ' ');
    }
  }
  return blanks;
}

std::string cutToWidth(std::string_view text, int columns) {
  std::u32string fitting;
  for (const char32_t character : toCharacters(text)) {
    columns -= displayWidth(character);
    if (columns < 0) break;
    fitting += character;
  }
  return utf8::utf32to8(fitting);
}

std::string quoteWord(std::string_view text) {
  constexpr int kWidest = 40;  // columns
  constexpr std::size_t kMostBytes = 4 * (std::size_t{kWidest} + 1);
  const std::string_view line = text.substr(0, text.find_first_of("\r\n"));
  const std::string shown = cutToWidth(line.substr(0, kMostBytes), kWidest);
  return "`" + shown + (shown.size() < line.size() ? "\u2026`" : "`");
}

int displayWidth(char32_t codePoint) {
  if (isIn(kZeroWidth, codePoint)) return 0;
  return isIn(kWide, codePoint) ? 2 : 1;
}

}  // namespace tools
