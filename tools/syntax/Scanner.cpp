#include "tools/syntax/Scanner.h"

#include <algorithm>

#include "ktWfmScriptCompiler/ByteClass.h"

namespace tools {
namespace {

using ktwfmscriptcompiler::ByteClass;
using ktwfmscriptcompiler::classOf;

constexpr std::uint64_t kMaxInteger = 2147483647;

bool isDigit(char byte) { return byte >= '0' && byte <= '9'; }

std::uint64_t appendDigit(std::uint64_t value, char digit) {
  return std::min(10 * value + static_cast<std::uint64_t>(digit - '0'), kMaxInteger + 1);
}

// Of a word that begins with a digit and is no name that the vocabulary knows. The lexer reads digits up to the end of
// the word, and begins anew behind every other byte.
TokenFault faultOfNumber(std::string_view word) {
  std::uint64_t value = 0;
  bool hasOthers = false;
  for (const char byte : word) {
    hasOthers = hasOthers || !isDigit(byte);
    value = isDigit(byte) ? appendDigit(value, byte) : 0;
  }
  if (value > kMaxInteger) return TokenFault::kTooLarge;
  return hasOthers ? TokenFault::kNoName : TokenFault::kNone;
}

bool looksLikeNumber(std::string_view word) {
  const std::size_t sign = word.find_first_not_of("+-.");
  return sign <= 2 && sign < word.size() && isDigit(word[sign]);
}

}  // namespace

std::size_t endOfChunk(std::string_view text, std::size_t start) {
  const auto end = std::find_if(text.begin() + static_cast<std::ptrdiff_t>(start), text.end(), [](char byte) {
    const ByteClass byteClass = classOf(byte);
    return byteClass != ByteClass::kWord && byteClass != ByteClass::kInvalid;
  });
  return static_cast<std::size_t>(end - text.begin());
}

SyntaxToken Scanner::next() {
  skipToToken();
  if (cursor_ == text_.size()) return make(cursor_, TokenType::kEndOfScript);
  const ByteClass byteClass = classOf(text_[cursor_]);
  if (byteClass == ByteClass::kSlash) return takeSlash();
  if (byteClass < ByteClass::kPunctuation) return takeWord();
  return make(cursor_ + 1, ktwfmscriptcompiler::kPunctuationMarks[markOf(byteClass)].type);
}

void Scanner::skipToToken() {
  for (; cursor_ < text_.size(); ++cursor_) {
    const ByteClass byteClass = classOf(text_[cursor_]);
    if (byteClass == ByteClass::kLineFeed) isFirstOfLine_ = true;
    if (byteClass == ByteClass::kBlank || byteClass == ByteClass::kLineFeed) continue;
    if (!at(cursor_, "//")) return;
    cursor_ = std::min(text_.find('\n', cursor_), text_.size()) - 1;
  }
}

SyntaxToken Scanner::takeWord() {
  const std::size_t end = endOfChunk(text_, cursor_);
  const std::string_view word = text_.substr(cursor_, end - cursor_);
  if (word.starts_with('#')) {  // a comment in many languages
    return make(std::min(text_.find('\n', cursor_), text_.size()), TokenType::kIdentifier, TokenFault::kBadCharacter);
  }
  if (!std::ranges::all_of(word, ktwfmscriptcompiler::isIdentifierCharacter)) {
    return make(end, looksLikeNumber(word) ? TokenType::kInteger : TokenType::kIdentifier, TokenFault::kBadCharacter);
  }
  const TokenType type = vocabulary_.find(word).type;
  if (type != TokenType::kIdentifier || !isDigit(word.front())) return make(end, type);
  return make(end, TokenType::kInteger, faultOfNumber(word));
}

// A comment of many languages is taken whole, within its line.
SyntaxToken Scanner::takeSlash() {
  std::size_t end = cursor_ + 1;
  if (at(cursor_, "/*")) {
    end = std::min(text_.find('\n', cursor_), text_.size());
    end = std::min(end, text_.find("*/", cursor_ + 2) + std::string_view("*/").size());
  }
  return make(std::max(end, cursor_ + 1), TokenType::kIdentifier, TokenFault::kLoneSlash);
}

SyntaxToken Scanner::make(std::size_t end, TokenType type, TokenFault fault) {
  const auto length = std::min<std::size_t>(end - cursor_, SyntaxToken::kLongest);
  const SyntaxToken token(static_cast<std::uint32_t>(cursor_), static_cast<std::uint32_t>(length), type, fault,
                          isFirstOfLine_);
  cursor_ = end;
  isFirstOfLine_ = false;
  return token;
}

}  // namespace tools
