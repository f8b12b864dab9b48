#include "kterr/JsonWriter.h"

#include <algorithm>
#include <charconv>
#include <cstring>
#include <limits>
#include <optional>

#include "kterr/JsonReader.h"

namespace kterr {
namespace {

// Whether `count` zero bytes stand between the terminator at `end` and the sentinel: none of them is the sentinel.
bool hasRoom(const char* end, std::size_t count) { return std::memchr(end + 1, kSentinel, count) == nullptr; }

// Whether the container around `position` holds nothing: only blanks between its opening and closing characters.
bool isEmptyContainer(char* position) {
  const char* after = skipJsonBlanks(position);
  if (*after != '}' && *after != ']') return *after == '\0';
  // A closing character follows, so its opening one stands before.
  const char* before = position - 1;
  while (isJsonBlank(*before)) --before;
  return *before == (*after == '}' ? '{' : '[');
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

// A text and the lengths that it has as it is and with JSON escapes.
struct JsonText {
  explicit JsonText(const char* source) : text(source), length(std::strlen(source)), escapedLength(length) {
    if (!arePlainJson({text, length})) escapedLength = kterr::escapedLength(text);
  }

  const char* text;
  std::size_t length;
  std::size_t escapedLength;
};

// Bytes of `"key":`; none without a key.
std::size_t keyLength(const std::optional<JsonText>& key) { return key ? key->escapedLength + 3 : 0; }

std::optional<JsonText> makeKey(const char* key) {
  return key != nullptr ? std::optional(JsonText(key)) : std::nullopt;
}

char* writeQuoted(char* destination, const JsonText& text) {
  *destination++ = '"';
  if (text.length == text.escapedLength) {
    std::memcpy(destination, text.text, text.length);
  } else {
    escape(destination, text.text);
  }
  destination[text.escapedLength] = '"';
  return destination + text.escapedLength + 1;
}

char* writeKey(char* destination, const std::optional<JsonText>& key) {
  if (!key) return destination;
  destination = writeQuoted(destination, *key);
  *destination++ = ':';
  return destination;
}

// Inserts `"key":` and `length` bytes of `value` as they are.
char* addLiteral(char* position, const char* key, const char* value, std::size_t length) {
  const std::optional<JsonText> keyText = makeKey(key);
  char* room = makeRoom(position, keyLength(keyText) + length);
  if (room == nullptr) return nullptr;
  room = writeKey(room, keyText);
  std::memcpy(room, value, length);
  return room + length;
}

template <typename Integer>
char* addInteger(char* position, const char* key, Integer value) {
  char digits[std::numeric_limits<Integer>::digits10 + 2];
  const char* end = std::to_chars(digits, digits + sizeof digits, value).ptr;
  return addLiteral(position, key, digits, static_cast<std::size_t>(end - digits));
}

// The growth itself: as growJson(), whatever becomes of the text.
char* growBuffer(char* position, tStatus& status) {
  const std::int64_t capacity = status.capacity;
  if (status.json == nullptr || status.reallocJson == nullptr || 2 * capacity - 4 > kMaxJsonLength) return nullptr;
  const std::ptrdiff_t offset = position - status.json;
  const std::int64_t wanted = 2 * capacity - 2;
  if (wanted > capacity && !status.reallocJson(&status, static_cast<std::uint32_t>(wanted))) return nullptr;
  return status.json != nullptr && status.capacity > capacity ? status.json + offset : nullptr;
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
  for (; *text != '\0'; ++text) length += isPlainJson(*text) ? 1 : shortEscape(*text) != 0 ? 2 : 6;
  return length;
}

char* escape(char* destination, const char* text) {
  constexpr char kHex[] = "0123456789abcdef";
  for (;; ++text) {
    const char* special = text;
    while (isPlainJson(*special)) ++special;
    destination = std::copy(text, special, destination);
    text = special;
    if (*text == '\0') return destination;
    *destination++ = '\\';
    if (const char letter = shortEscape(*text)) {
      *destination++ = letter;
      continue;
    }
    destination = std::copy_n("u00", 3, destination);
    *destination++ = kHex[*text >> 4];
    *destination++ = kHex[*text & 0xF];
  }
}

char* addString(char* position, const char* key, const char* value) {
  const std::optional<JsonText> keyText = makeKey(key);
  const JsonText valueText(value);
  char* room = makeRoom(position, keyLength(keyText) + valueText.escapedLength + 2);
  return room != nullptr ? writeQuoted(writeKey(room, keyText), valueText) : nullptr;
}

char* addInt(char* position, const char* key, std::int32_t value) { return addInteger(position, key, value); }
char* addUInt(char* position, const char* key, std::uint32_t value) { return addInteger(position, key, value); }
char* addObject(char* position, const char* key) { return addLiteral(position, key, "{}", 2); }
char* addArray(char* position, const char* key) { return addLiteral(position, key, "[]", 2); }

char* addRaw(char* position, std::initializer_list<std::string_view> pieces) {
  std::size_t length = 0;
  for (const std::string_view piece : pieces) length += piece.size();
  char* room = makeRoom(position, length);
  if (room == nullptr) return nullptr;
  for (const std::string_view piece : pieces) room = std::copy(piece.begin(), piece.end(), room);
  return room;
}

char* growJson(char* position, tStatus& status) {
  char* const grown = growBuffer(position, status);
  return grown != nullptr && findEnd(status.json) != nullptr ? grown : nullptr;
}

char* growParsed(char* position, tStatus& status) {
  char before[512];
  const std::size_t size = std::strlen(status.json) + 1;
  if (size > sizeof before) return growJson(position, status);
  std::memcpy(before, status.json, size);
  char* const grown = growBuffer(position, status);
  const bool stillParses =
      grown != nullptr && (std::memcmp(status.json, before, size) == 0 || findEnd(status.json) != nullptr);
  return stillParses ? grown : nullptr;
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

JsonCursor putLiteral(JsonCursor cursor, const char* key, const char* literal) {
  return retry(cursor, [=](char* position) { return addLiteral(position, key, literal, std::strlen(literal)); });
}

JsonCursor putObject(JsonCursor cursor, const char* key) {
  return retry(cursor, [=](char* position) { return addObject(position, key); });
}

JsonCursor putArray(JsonCursor cursor, const char* key) {
  return retry(cursor, [=](char* position) { return addArray(position, key); });
}

}  // namespace kterr
