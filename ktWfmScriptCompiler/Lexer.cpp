#include "ktWfmScriptCompiler/Lexer.h"

#include <algorithm>

#include "ktWfmScriptCompiler/ScriptFailure.h"

namespace ktwfmscriptcompiler {
namespace {

constexpr char kSource[] = R"(ktWfmScriptCompiler\Lexer)";

constexpr std::uint64_t kMaxInteger = 2147483647;

bool isDigit(char byte) { return byte >= '0' && byte <= '9'; }

[[noreturn]] void raiseIntegerExpected(const Token& word) {
  ScriptFailure(ktwfmscriptcompiler_errors::kErrorIntegerExpectedInScript, kSource, word.position)
      .usage(kterr::kUsageTypeBadValue, std::string(word.text))
      .usage(kterr::kUsageTypeMinValue, std::int32_t{0})
      .usage(kterr::kUsageTypeMaxValue, static_cast<float>(kMaxInteger))
      .raise();
}

[[noreturn]] void raiseInvalidIdentifier(const Token& word) {
  ScriptFailure(ktwfmscriptcompiler_errors::kErrorScriptHasInvalidIdentifier, kSource, word.position)
      .usage(kterr::kUsageTypeInvalidIdentifier, std::string(word.text))
      .raise();
}

// Appends a digit to a number; numbers above kMaxInteger are all the same.
std::uint64_t appendDigit(std::uint64_t value, char digit) {
  return std::min(10 * value + static_cast<std::uint64_t>(digit - '0'), kMaxInteger + 1);
}

// A word of digits and others has two faults when its last digits are too great a number; that one is reported.
[[noreturn]] void raiseNoNumber(const Token& word) {
  std::uint64_t lastDigits = 0;
  for (const char byte : word.text) lastDigits = isDigit(byte) ? appendDigit(lastDigits, byte) : 0;
  if (lastDigits > kMaxInteger) raiseIntegerExpected(word);
  raiseInvalidIdentifier(word);
}

std::uint32_t readNumber(const Token& word) {
  std::uint64_t value = 0;
  for (const char byte : word.text) {
    if (!isDigit(byte)) raiseNoNumber(word);
    value = appendDigit(value, byte);
  }
  if (value > kMaxInteger) raiseIntegerExpected(word);
  return static_cast<std::uint32_t>(value);
}

}  // namespace

Lexer::Lexer(const ScriptTraits& traits) : vocabulary_(traits) { setScript({}); }

void Lexer::setScript(const std::string& text) {
  text_.clear();
  text_.reserve(text.size() + kScanBytes);
  text_.append(text).append(kScanBytes, '\0');
  cursor_ = lineStart_ = text_.data();
  end_ = cursor_ + text.size();
  line_ = 1;
}

// What runs for every token is inline in getNextToken, which stands behind it.
inline ByteClass Lexer::skipWhitespaceAndComments() {
  ByteClass next = skipWhitespace();
  while (next == ByteClass::kSlash) {
    skipComment();
    next = skipWhitespace();
  }
  return next;
}

inline ByteClass Lexer::skipWhitespace() {
  for (;;) {
    const char* cursor = cursor_;  // in a register: the text might be the member, for all the compiler knows
    while (classOf(*cursor) == ByteClass::kBlank) ++cursor;
    const ByteClass next = classOf(*cursor);
    cursor_ = cursor;
    if (next != ByteClass::kLineFeed) return next;
    consumeLineFeed();
  }
}

SourcePosition Lexer::position() const { return {line_, static_cast<std::uint32_t>(cursor_ - lineStart_) + 1}; }

void Lexer::consumeLineFeed() {
  lineStart_ = ++cursor_;
  ++line_;
}

// Stops before the line feed.
void Lexer::skipComment() {
  ++cursor_;
  if (*cursor_ != '/') {
    ScriptFailure(ktwfmscriptcompiler_errors::kErrorKeywordExpectedInScript, kSource, position())
        .usage(kterr::kUsageTypeBadValue, std::string(cursor_, cursor_ == end_ ? 0 : 1))
        .usage(kterr::kUsageTypePossibleKeywords, kCommentKeyword)
        .raise();
  }
  const std::string_view rest(cursor_, end_);
  cursor_ += std::min(rest.find('\n'), rest.size());
}

inline Token Lexer::takePunctuation(ByteClass punctuation) {
  const Token token{kPunctuationMarks[markOf(punctuation)].type, {cursor_, 1}, 0, position()};
  ++cursor_;
  return token;
}

// Not so at a byte that no word holds and nothing may follow a word with.
inline bool Lexer::endsWord(const char* place) const {
  const ByteClass next = classOf(*place);
  return next > ByteClass::kWord || (next == ByteClass::kInvalid && place == end_);
}

// As takeAnyWord, for most words, which are short and ASCII, in one step; leaves the others to it.
inline Token Lexer::takeWord() {
  const std::uint64_t bytes = loadBytes(cursor_);
  const std::size_t count = countWordBytes(bytes);
  const std::uint64_t word = bytes & firstBytes(count);
  if ((word & kHighBits) != 0 || !vocabulary_.keysSuffice() || !endsWord(cursor_ + count)) return takeAnyWord();
  const Meaning meaning = vocabulary_.findKey(foldWordBytes(bytes) & firstBytes(count));
  if (meaning.type == TokenType::kIdentifier && isDigit(*cursor_)) return takeAnyWord();
  const Token token{meaning.type, {cursor_, count}, meaning.value, position()};
  cursor_ += count;
  return token;
}

Token Lexer::takeAnyWord() {
  const char* const last = endOfWord(cursor_);
  if (!endsWord(last)) raiseInvalidCharacter(*last);
  Token word{TokenType::kIdentifier, {cursor_, last}, 0, position()};
  classifyWord(word);
  cursor_ = last;
  return word;
}

// What the vocabulary does not know is a number when it begins with a digit, and a name when it does not.
void Lexer::classifyWord(Token& word) const {
  const Meaning meaning = vocabulary_.find(word.text);
  word.type = meaning.type;
  word.value = meaning.value;
  if (meaning.type != TokenType::kIdentifier || !isDigit(word.text.front())) return;
  word.value = readNumber(word);
  word.type = TokenType::kInteger;
}

// As takeAnyWord, for most numbers, in one pass and without a look-up; leaves all else that begins with a digit to it.
inline Token Lexer::takeNumber() {
  constexpr std::ptrdiff_t kMaxDigits = 10;  // of kMaxInteger
  const char* last = cursor_;
  std::uint64_t value = 0;
  for (; isDigit(*last); ++last) value = 10 * value + static_cast<std::uint64_t>(*last - '0');
  if (last - cursor_ > kMaxDigits || value > kMaxInteger || !endsWord(last)) return takeAnyWord();
  const Token token{TokenType::kInteger, {cursor_, last}, static_cast<std::uint32_t>(value), position()};
  cursor_ = last;
  return token;
}

Token Lexer::getNextToken() {
  const ByteClass next = skipWhitespaceAndComments();
  if (next == ByteClass::kWord) {
    return isDigit(*cursor_) && !vocabulary_.hasDigitNames() ? takeNumber() : takeWord();
  }
  if (next >= ByteClass::kPunctuation) return takePunctuation(next);
  if (cursor_ != end_) raiseInvalidCharacter(*cursor_);
  return {TokenType::kEndOfScript, {}, 0, position()};
}

void Lexer::raiseInvalidCharacter(char byte) const {
  ScriptFailure(ktwfmscriptcompiler_errors::kErrorScriptHasInvalidCharacter, kSource, position())
      .usage(kterr::kUsageTypeBadValue, std::int32_t{static_cast<unsigned char>(byte)})
      .raise();
}

}  // namespace ktwfmscriptcompiler
