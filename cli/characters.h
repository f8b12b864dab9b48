// UTF-8 as terminals and pictures need it: strict decoding, and how wide a character is shown.
#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

namespace cli {

struct Utf8Character {
  char32_t codePoint = 0;  // U+FFFD where the bytes are not valid
  std::size_t length = 1;  // bytes; 1 where they are not valid
  bool isValid = true;
};

// The first character of `text`, which is not empty. Overlong forms, surrogates and values above U+10FFFF are invalid.
Utf8Character decodeCharacter(std::string_view text);

// The index of the first byte that is part of no valid character, or nothing.
std::optional<std::size_t> findInvalidUtf8(std::string_view text);

// `text` with U+FFFD for every byte that is not valid.
std::string toValidUtf8(std::string_view text);

// Columns that a terminal gives the character: 0 for combining and control characters, 2 for wide ones, else 1.
int displayWidth(char32_t codePoint);

}  // namespace cli
