// Finds members and ends in JSON text, in place: positions in, positions out, nothing is built or written.
// No function recurses; containers nested deeper than kMaxJsonDepth do not parse.
#pragma once

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

// Returns the first position at or behind `text` that is no space, tab, carriage return or line feed.
char* skipJsonBlanks(char* text);

// Whether the JSON string that opens at `string` (a quote), decoded, is exactly `text`.
bool jsonStringEquals(char* string, const char* text);

}  // namespace kterr
