#include "kterr/JsonWriter.h"

#include <algorithm>
#include <charconv>
#include <cstring>
#include <limits>

#include "kterr/JsonReader.h"

namespace kterr {
namespace {

bool isBlank(char c) { return c == ' ' || c == '\t' || c == '\r' || c == '\n'; }

// Whether `count` zero bytes stand between the terminator at `end` and the sentinel. The sentinel is not zero, so
// the look never passes the buffer.
bool hasRoom(const char* end, std::size_t count) {
  return std::all_of(end + 1, end + 1 + count, [](char c) { return c == '\0'; });
}

// Whether the container around `position` holds nothing: only blanks between its opening and closing characters.
bool isEmptyContainer(char* position) {
  char* after = skipJsonBlanks(position);
  if (*after == '\0') return true;
  const char* before = position - 1;
  while (isBlank(*before)) --before;
  return (*before == '{' && *after == '}') || (*before == '[' && *after == ']');
}

// The letter behind the backslash of a two-character escape, or 0.
char shortEscape(char c) {
  switch (c) {
    case '\b':
      return 'b';
    case '\t':
      return 't';
    case '\n':
      return 'n';
    case '\f':
      return 'f';
    case '\r':
      return 'r';
    case '"':
      return '"';
    case '\\':
      return '\\';
    default:
      return 0;
  }
}

bool needsHexEscape(char c) { return static_cast<unsigned char>(c) < 0x20 || c == 0x7F; }

bool isPlain(char c) { return !needsHexEscape(c) && c != '"' && c != '\\'; }

std::size_t keyLength(const char* key) { return key != nullptr ? escapedLength(key) + 3 : 0; }

char* writeQuoted(char* destination, const char* text) {
  *destination++ = '"';
  destination = escape(destination, text);
  *destination++ = '"';
  return destination;
}

char* writeKey(char* destination, const char* key) {
  if (key == nullptr) return destination;
  destination = writeQuoted(destination, key);
  *destination++ = ':';
  return destination;
}

// Inserts `"key":` and `length` bytes of `value` as they are.
char* addRaw(char* position, const char* key, const char* value, std::size_t length) {
  char* room = makeRoom(position, keyLength(key) + length);
  if (room == nullptr) return nullptr;
  room = writeKey(room, key);
  std::memcpy(room, value, length);
  return room + length;
}

template <typename Integer>
char* addInteger(char* position, const char* key, Integer value) {
  char digits[std::numeric_limits<Integer>::digits10 + 2];
  const char* end = std::to_chars(digits, digits + sizeof digits, value).ptr;
  return addRaw(position, key, digits, static_cast<std::size_t>(end - digits));
}

// Runs a primitive at the cursor, growing the buffer until it fits or growth fails.
template <typename Primitive>
JsonCursor retry(JsonCursor cursor, Primitive primitive) {
  while (cursor.position != nullptr) {
    if (char* behind = primitive(cursor.position)) {
      cursor.position = behind;
      break;
    }
    cursor.position = cursor.grow != nullptr ? cursor.grow(cursor.position, *cursor.status) : nullptr;
  }
  return cursor;
}

}  // namespace

char* makeRoom(char* position, std::size_t count) {
  const bool afterOpening = *position == '{' || *position == '[';
  char* insertion = afterOpening ? position + 1 : position;
  const bool isEmpty = isEmptyContainer(insertion);
  const std::size_t needed = count + (isEmpty ? 0 : 1);
  char* end = insertion + std::strlen(insertion);
  if (!hasRoom(end, needed)) return nullptr;
  std::memmove(insertion + needed, insertion, static_cast<std::size_t>(end - insertion));
  end[needed] = '\0';
  if (isEmpty) return insertion;
  insertion[afterOpening ? count : 0] = ',';
  return afterOpening ? insertion : insertion + 1;
}

std::size_t escapedLength(const char* text) {
  std::size_t length = 0;
  for (; *text != '\0'; ++text) length += isPlain(*text) ? 1 : shortEscape(*text) != 0 ? 2 : 6;
  return length;
}

char* escape(char* destination, const char* text) {
  for (; *text != '\0'; ++text) {
    if (isPlain(*text)) {
      *destination++ = *text;
      continue;
    }
    *destination++ = '\\';
    if (const char letter = shortEscape(*text)) {
      *destination++ = letter;
      continue;
    }
    constexpr char kHex[] = "0123456789abcdef";
    std::memcpy(destination, "u00", 3);
    destination[3] = kHex[*text >> 4];
    destination[4] = kHex[*text & 0xF];
    destination += 5;
  }
  return destination;
}

char* addString(char* position, const char* key, const char* value) {
  char* room = makeRoom(position, keyLength(key) + escapedLength(value) + 2);
  return room != nullptr ? writeQuoted(writeKey(room, key), value) : nullptr;
}

char* addInt(char* position, const char* key, std::int32_t value) { return addInteger(position, key, value); }
char* addUInt(char* position, const char* key, std::uint32_t value) { return addInteger(position, key, value); }
char* addObject(char* position, const char* key) { return addRaw(position, key, "{}", 2); }
char* addArray(char* position, const char* key) { return addRaw(position, key, "[]", 2); }

char* growJson(char* position, tStatus& status) {
  const std::int64_t capacity = status.capacity;
  if (status.json == nullptr || status.reallocJson == nullptr || 2 * capacity - 4 > kMaxJsonLength) return nullptr;
  const std::ptrdiff_t offset = position - status.json;
  const std::int64_t wanted = 2 * capacity - 2;
  if (wanted > capacity && !status.reallocJson(&status, static_cast<std::uint32_t>(wanted))) return nullptr;
  const bool grew = status.json != nullptr && status.capacity > capacity;
  return grew && findEnd(status.json) != nullptr ? status.json + offset : nullptr;
}

JsonCursor put(JsonCursor cursor, const char* key, const char* value) {
  return retry(cursor, [=](char* position) { return addString(position, key, value); });
}

JsonCursor put(JsonCursor cursor, const char* key, std::int32_t value) {
  return retry(cursor, [=](char* position) { return addInt(position, key, value); });
}

JsonCursor put(JsonCursor cursor, const char* key, std::uint32_t value) {
  return retry(cursor, [=](char* position) { return addUInt(position, key, value); });
}

JsonCursor putObject(JsonCursor cursor, const char* key) {
  return retry(cursor, [=](char* position) { return addObject(position, key); });
}

JsonCursor putArray(JsonCursor cursor, const char* key) {
  return retry(cursor, [=](char* position) { return addArray(position, key); });
}

}  // namespace kterr
