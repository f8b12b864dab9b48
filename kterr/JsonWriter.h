// Writes JSON in place, inside a tStatus buffer (see kterr/Status.h for its invariants): each primitive inserts at a
// position in the text, keeps the text well-formed, and returns null with nothing changed when the free room is too
// small. A JsonCursor adds growth: its operations retry with the grow step until they fit or growth fails, and after
// a failed growth they write nothing more. The text is compact: single commas and colons, no blanks.
//
// Raise sites use kterr/Failure.h; this is the engine behind it.
#pragma once

#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <string_view>

#include "kterr/Status.h"

namespace kterr {

// Opens `count` bytes at `position` for a new item and places the comma that it needs: in front of the first item
// when `position` is on an opening brace or bracket, else at `position`, behind what stands there.
// Returns where the item's bytes go.
char* makeRoom(char* position, std::size_t count);

// Bytes that escape() writes for `text`.
std::size_t escapedLength(const char* text);

// Writes `text` with JSON escapes, without quotes; bytes from 0x80 up pass unchanged. Returns the end.
char* escape(char* destination, const char* text);

// Each inserts `"key":value`, or the value alone when `key` is null, and returns the position behind the value.
char* addString(char* position, const char* key, const char* value);
char* addInt(char* position, const char* key, std::int32_t value);
char* addUInt(char* position, const char* key, std::uint32_t value);
char* addObject(char* position, const char* key);
char* addArray(char* position, const char* key);

// Inserts one item whose text is `pieces` as they stand, one behind the other.
char* addRaw(char* position, std::initializer_list<std::string_view> pieces);

// Enlarges the buffer that `position` points into and returns the same position in the new buffer; null when the
// record refuses, the size limit is reached, or the text no longer parses as an object or array.
char* growJson(char* position, tStatus& status);

// The same for a text that is known to parse: it parsed when it was opened, and every insertion has kept it so. One
// that comes out of the callback as it went in needs no second reading.
char* growParsed(char* position, tStatus& status);

// A place in a record's text. Copies are cheap; writing through one cursor moves the text under all others.
struct JsonCursor {
  char* position = nullptr;                  // null: writing has stopped
  char* (*grow)(char*, tStatus&) = nullptr;  // growJson, growParsed, or null for a buffer of fixed size
  tStatus* status = nullptr;                 // whose buffer is written; not owned
};

// As the primitives, through a cursor: the result stands behind the inserted value.
JsonCursor put(JsonCursor cursor, const char* key, const char* value);
JsonCursor put(JsonCursor cursor, const char* key, std::int32_t value);
JsonCursor put(JsonCursor cursor, const char* key, std::uint32_t value);
JsonCursor putLiteral(JsonCursor cursor, const char* key, const char* literal);  // as it stands: digits
JsonCursor putObject(JsonCursor cursor, const char* key);
JsonCursor putArray(JsonCursor cursor, const char* key);

}  // namespace kterr
