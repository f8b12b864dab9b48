#include "kterr/JsonReader.h"

#include <bitset>
#include <cstdint>
#include <cstring>
#include <string_view>

namespace kterr {
namespace {

bool isDigit(char c) { return c >= '0' && c <= '9'; }

int hexValue(char c) {
  if (isDigit(c)) return c - '0';
  if (c >= 'a' && c <= 'f') return c - 'a' + 10;
  if (c >= 'A' && c <= 'F') return c - 'A' + 10;
  return -1;
}

// The four hexadecimal digits at `text` as a number, or -1.
std::int32_t parseHex4(const char* text) {
  std::int32_t value = 0;
  for (int i = 0; i < 4; ++i) {
    const int digit = hexValue(text[i]);
    if (digit < 0) return -1;
    value = value * 16 + digit;
  }
  return value;
}

// Skips what stands behind the backslash of an escape.
char* parseEscape(char* text) {
  if (*text == 'u') return parseHex4(text + 1) >= 0 ? text + 5 : nullptr;
  return *text != '\0' && std::strchr("\"/\\bfnrt", *text) != nullptr ? text + 1 : nullptr;
}

char* parseString(char* text) {
  if (*text++ != '"') return nullptr;
  char* quote = std::strchr(text, '"');
  if (quote == nullptr) return nullptr;
  if (arePlainJson({text, quote})) return quote + 1;
  for (;;) {
    while (isPlainJson(*text)) ++text;
    if (*text == '"') return text + 1;
    if (*text != '\\' || (text = parseEscape(text + 1)) == nullptr) return nullptr;
  }
}

char* skipDigits(char* text) {
  while (isDigit(*text)) ++text;
  return text;
}

char* parseNumber(char* text) {
  if (*text != '-' && !isDigit(*text)) return nullptr;
  text = skipDigits(text + 1);
  if (*text == '.') text = skipDigits(text + 1);
  const bool exponent = (*text == 'e' || *text == 'E') && (text[1] == '+' || text[1] == '-' || isDigit(text[1]));
  return exponent ? skipDigits(text + 2) : text;
}

char* parseLiteral(char* text) {
  for (const std::string_view literal : {"true", "false", "null"}) {
    if (std::strncmp(text, literal.data(), literal.size()) == 0) return text + literal.size();
  }
  return nullptr;
}

char* parseScalar(char* text) {
  if (char* end = parseString(text)) return end;
  if (char* end = parseNumber(text)) return end;
  return parseLiteral(text);
}

// Skips `"name" :` and the blanks around the colon.
char* parseMemberName(char* text) {
  char* end = parseString(text);
  if (end == nullptr) return nullptr;
  end = skipJsonBlanks(end);
  return *end == ':' ? skipJsonBlanks(end + 1) : nullptr;
}

bool opensContainer(char c) { return c == '{' || c == '['; }

// One parse, over an explicit stack of the containers that are open: a set bit is an object.
class ValueParser {
 public:
  char* parse(char* text) {
    while (text != nullptr) {
      text = parseItem(text);
      while (text != nullptr && !descended_) {
        if (depth_ == 0) return text;
        text = parseSeparator(text);
      }
    }
    return nullptr;
  }

 private:
  // Reads a whole scalar or empty container, or enters a container and stops before its first item.
  char* parseItem(char* text) {
    descended_ = false;
    if (!opensContainer(*text)) return parseScalar(text);
    const bool isObject = *text == '{';
    text = skipJsonBlanks(text + 1);
    if (*text == (isObject ? '}' : ']')) return text + 1;
    if (depth_ == kMaxJsonDepth) return nullptr;
    isObject_[static_cast<std::size_t>(depth_++)] = isObject;
    return enterItem(text);
  }

  // Behind an item: a comma leads to the next item, a closing character leaves the container.
  char* parseSeparator(char* text) {
    text = skipJsonBlanks(text);
    if (*text == ',') return enterItem(skipJsonBlanks(text + 1));
    if (*text != (inObject() ? '}' : ']')) return nullptr;
    --depth_;
    return text + 1;
  }

  char* enterItem(char* text) {
    descended_ = true;
    return inObject() ? parseMemberName(text) : text;
  }

  bool inObject() const { return isObject_[static_cast<std::size_t>(depth_ - 1)]; }

  std::bitset<kMaxJsonDepth> isObject_;
  int depth_ = 0;
  bool descended_ = false;
};

// Decodes a JSON string byte by byte; next() gives -1 behind the last one.
class StringDecoder {
 public:
  explicit StringDecoder(const char* openingQuote) : text_(openingQuote + 1) {}

  int next() {
    if (pendingUsed_ < pendingCount_) return pending_[pendingUsed_++];
    if (*text_ == '"') return -1;
    if (*text_ != '\\') return static_cast<unsigned char>(*text_++);
    const char escape = text_[1];
    text_ += 2;
    if (escape == 'u') return startCodePoint(readCodePoint());
    constexpr std::string_view kNames = "bfnrt";
    constexpr std::string_view kBytes = "\b\f\n\r\t";
    const std::size_t index = kNames.find(escape);
    return index == std::string_view::npos ? escape : kBytes[index];
  }

 private:
  std::uint32_t readCodePoint() {
    const auto high = static_cast<std::uint32_t>(parseHex4(text_));
    text_ += 4;
    const bool isHigh = high >= 0xD800 && high < 0xDC00;
    if (!isHigh || text_[0] != '\\' || text_[1] != 'u') return high;
    const auto low = static_cast<std::uint32_t>(parseHex4(text_ + 2));
    if (low < 0xDC00 || low >= 0xE000) return high;
    text_ += 6;
    return 0x10000 + ((high - 0xD800) << 10) + (low - 0xDC00);
  }

  int startCodePoint(std::uint32_t codePoint) {
    pendingUsed_ = pendingCount_ = 0;
    const auto add = [&](std::uint32_t byte) { pending_[pendingCount_++] = static_cast<unsigned char>(byte); };
    if (codePoint < 0x80) {
      add(codePoint);
    } else if (codePoint < 0x800) {
      add(0xC0 | codePoint >> 6);
    } else if (codePoint < 0x10000) {
      add(0xE0 | codePoint >> 12);
    } else {
      add(0xF0 | codePoint >> 18);
      add(0x80 | (codePoint >> 12 & 0x3F));
    }
    if (codePoint >= 0x800) add(0x80 | (codePoint >> 6 & 0x3F));
    if (codePoint >= 0x80) add(0x80 | (codePoint & 0x3F));
    return pending_[pendingUsed_++];
  }

  const char* text_;
  unsigned char pending_[4] = {};
  int pendingUsed_ = 0;
  int pendingCount_ = 0;
};

}  // namespace

char* skipJsonBlanks(char* text) {
  while (isJsonBlank(*text)) ++text;
  return text;
}

bool arePlainJson(std::string_view text) {
  unsigned char anyEscape = 0;  // no way out of the loop and no wider type: so compilers take many bytes at a time
  for (const char c : text) anyEscape = static_cast<unsigned char>(anyEscape | !isPlainJson(c));
  return anyEscape == 0;
}

char* parseValue(char* text) { return ValueParser{}.parse(text); }

char* findEnd(char* text) {
  if (!opensContainer(*text)) return nullptr;
  char* end = parseValue(text);
  return end != nullptr ? end - 1 : nullptr;
}

bool jsonStringEquals(char* string, const char* text) {
  StringDecoder decoder(string);
  for (; *text != '\0'; ++text) {
    if (decoder.next() != static_cast<unsigned char>(*text)) return false;
  }
  return decoder.next() == -1;
}

void copyJsonStringTail(char* string, char* buffer, std::size_t capacity) {
  std::size_t length = 0;
  for (StringDecoder decoder(string); decoder.next() != -1;) ++length;
  const bool cut = length >= capacity;
  StringDecoder decoder(string);
  for (; length >= capacity; --length) decoder.next();
  int byte = decoder.next();
  while (cut && (byte & 0xC0) == 0x80) byte = decoder.next();
  for (; byte != -1; byte = decoder.next()) *buffer++ = static_cast<char>(byte);
  *buffer = '\0';
}

char* findKey(char* objectText, const char* key) {
  char* text = skipJsonBlanks(objectText);
  if (*text != '{') return nullptr;
  do {
    char* name = skipJsonBlanks(text + 1);
    char* value = parseMemberName(name);
    if (value == nullptr) return nullptr;
    if (jsonStringEquals(name, key)) return value;
    text = parseValue(value);
    if (text == nullptr) return nullptr;
    text = skipJsonBlanks(text);
  } while (*text == ',');
  return nullptr;
}

}  // namespace kterr
