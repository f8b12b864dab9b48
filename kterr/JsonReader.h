// Finds members and ends in JSON text, in place: positions in, positions out, nothing is built or written.
// No function recurses; containers nested deeper than kMaxJsonDepth do not parse.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace kterr {

inline constexpr int kMaxJsonDepth = 1024;

// Returns the position behind the one JSON value that starts at `text`, or null when none does.
char* parseValue(char* text);

// Returns the position of the closing brace or bracket of the object or array that starts at `text` (no leading
// blanks), or null when it does not parse completely.
char* findEnd(char* text);

// Returns the position of the value of the first top-level member named `key` of the object at `objectText` (leading
// blanks are skipped), or null. Escapes in member names are decoded, \u surrogate pairs included.
char* findKey(char* objectText, const char* key);

// Space, tab, carriage return or line feed.
constexpr bool isJsonBlank(char c) { return c == ' ' || c == '\t' || c == '\r' || c == '\n'; }

// Stands for itself in a JSON string: no control byte, quote or backslash. Free of branches, see arePlainJson.
constexpr bool isPlainJson(char c) {
  const auto byte = static_cast<unsigned char>(c);
  return (byte >= 0x20) & (byte != 0x7F) & (byte != '"') & (byte != '\\');
}

// Whether every byte of `text` is plain. Most strings are, and this looks at many bytes at a time.
bool arePlainJson(std::string_view text);

// Returns the first position at or behind `text` that is no blank.
char* skipJsonBlanks(char* text);

// Whether the JSON string that opens at `string` (a quote), decoded, is exactly `text`.
bool jsonStringEquals(char* string, const char* text);

// Decodes the JSON string that opens at `string` (a quote), which must parse, and returns its end: at most `most`
// bytes, whole characters of UTF-8. What is no character, invalid bytes or half a surrogate pair, comes as U+FFFD.
std::string readJsonStringTail(char* string, std::size_t most);

}  // namespace kterr
