#include "kterr/JsonReader.h"

#include <utf8.h>

#include <array>
#include <cstdint>
#include <cstring>
#include <iterator>
#include <string>
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

// What isPlainJson() says of each byte. In a loop that may end at any byte a table is the quickest to ask.
constexpr std::array<bool, 256> kPlain = [] {
  std::array<bool, 256> plain{};
  for (std::size_t byte = 0; byte < plain.size(); ++byte) plain[byte] = isPlainJson(static_cast<char>(byte));
  return plain;
}();

char* parseString(char* text) {
  if (*text++ != '"') return nullptr;
  for (;;) {
    while (kPlain[static_cast<unsigned char>(*text)]) ++text;
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
  if (*text == '"') return parseString(text);
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

// The containers around a place in a text, outermost first.
class OpenContainers {
 public:
  bool empty() const { return depth_ == 0; }
  bool full() const { return depth_ == kMaxJsonDepth; }
  void enter(bool isObject) {
    const std::uint64_t bit = std::uint64_t{1} << (depth_ % 64);
    if (bit == 1) isObject_[depth_ / 64] = 0;  // here, since most texts never come this deep
    isObject_[depth_ / 64] = isObject ? isObject_[depth_ / 64] | bit : isObject_[depth_ / 64] & ~bit;
    ++depth_;
  }
  void leave() { --depth_; }
  bool inObject() const { return (isObject_[(depth_ - 1) / 64] >> ((depth_ - 1) % 64) & 1) != 0; }

 private:
  std::uint64_t isObject_[kMaxJsonDepth / 64];  // a bit each, set up as they are entered
  unsigned depth_ = 0;
};

// In front of an item: passes over what leads to it, in an object its name.
char* enterItem(char* text, const OpenContainers& open) { return open.inObject() ? parseMemberName(text) : text; }

// At a value: passes over a whole scalar or empty container, or enters a container, up to its first item.
char* parseItem(char* text, OpenContainers& open, bool& hasEntered) {
  hasEntered = false;
  const bool isObject = *text == '{';
  if (!isObject && *text != '[') return parseScalar(text);
  text = skipJsonBlanks(text + 1);
  if (*text == (isObject ? '}' : ']')) return text + 1;
  if (open.full()) return nullptr;
  open.enter(isObject);
  hasEntered = true;
  return enterItem(text, open);
}

// Behind an item: leaves the containers that end there, up to the next item or the end of the outermost one.
char* parseSeparators(char* text, OpenContainers& open) {
  while (!open.empty()) {
    text = skipJsonBlanks(text);
    if (*text == ',') return enterItem(skipJsonBlanks(text + 1), open);
    if (*text != (open.inObject() ? '}' : ']')) return nullptr;
    open.leave();
    ++text;
  }
  return text;
}

constexpr std::uint32_t kReplacement = 0xFFFD;

bool isContinuation(char byte) { return (static_cast<unsigned char>(byte) & 0xC0) == 0x80; }

// Decodes a JSON string byte by byte; next() gives -1 behind the last one.
class StringDecoder {
 public:
  explicit StringDecoder(const char* openingQuote) : text_(openingQuote + 1) {}

  int next() {
    if (pendingUsed_ < pendingCount_) return static_cast<unsigned char>(pending_[pendingUsed_++]);
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

  // Half a surrogate pair stands for no character.
  int startCodePoint(std::uint32_t codePoint) {
    const bool isSurrogate = codePoint >= 0xD800 && codePoint < 0xE000;
    const char* const end = utf8::unchecked::append(isSurrogate ? kReplacement : codePoint, pending_);
    pendingCount_ = static_cast<int>(end - pending_);
    pendingUsed_ = 1;
    return static_cast<unsigned char>(pending_[0]);
  }

  const char* text_;
  char pending_[4] = {};
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

char* parseValue(char* text) {
  OpenContainers open;
  do {
    bool hasEntered = false;
    text = parseItem(text, open, hasEntered);
    if (text != nullptr && !hasEntered) text = parseSeparators(text, open);
  } while (text != nullptr && !open.empty());
  return text;
}

char* findEnd(char* text) {
  if (*text != '{' && *text != '[') return nullptr;
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

std::string readJsonStringTail(char* string, std::size_t most) {
  constexpr std::size_t kLongestRest = 3;  // of a character that begins in front of what is kept
  std::size_t length = 0;
  for (StringDecoder decoder(string); decoder.next() != -1;) ++length;
  StringDecoder decoder(string);
  for (; length > most + kLongestRest; --length) decoder.next();
  std::string decoded;
  for (int byte = decoder.next(); byte != -1; byte = decoder.next()) decoded += static_cast<char>(byte);
  std::string text;
  utf8::replace_invalid(decoded.begin(), decoded.end(), std::back_inserter(text), kReplacement);
  if (text.size() <= most) return text;
  text.erase(0, text.size() - most);
  while (!text.empty() && isContinuation(text.front())) text.erase(0, 1);
  return text;
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
