// UTF-8 as terminals and pictures need it, and how wide a character is shown.
#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

namespace tools {

// The index of the first byte that is part of no valid character, or nothing.
std::optional<std::size_t> findInvalidUtf8(std::string_view text);

// `text` with U+FFFD for every byte that is part of no valid character.
std::string toValidUtf8(std::string_view text);

struct Character {
  char32_t codePoint = 0;  // U+FFFD where the first byte is part of no valid character
  std::size_t length = 1;  // bytes; 1 there
};

// The first character of `text`, which is not empty.
Character decodeCharacter(std::string_view text);

// The characters of toValidUtf8(text).
std::u32string toCharacters(std::string_view text);

// `text` as a terminal may be given it: valid UTF-8, control characters other than tabs replaced by U+FFFD.
std::string toPrintable(std::string_view text);

// Blanks that take as many columns as toPrintable(text) does; tabs stay, so that they end at the same column.
std::string blanksFor(std::string_view text);

// As many characters of `text` as fit into that many columns; none where `columns` is negative.
std::string cutToWidth(std::string_view text, int columns);

// "`word`", for messages: of long ones the beginning, of several lines the first.
std::string quoteWord(std::string_view text);

// Columns that a terminal gives the character: 0 for combining and control characters, 2 for wide ones, else 1.
int displayWidth(char32_t codePoint);

// An ASCII letter in lower case; any other character as it is.
constexpr char toLower(char c) { return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c; }

}  // namespace tools
