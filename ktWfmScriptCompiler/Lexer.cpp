#include "ktWfmScriptCompiler/Lexer.h"

#include <algorithm>
#include <cstring>

#include "ktWfmScriptCompiler/ByteClass.h"
#include "ktWfmScriptCompiler/ScriptFailure.h"

namespace ktwfmscriptcompiler {

namespace {

constexpr char kSource[] = R"(ktWfmScriptCompiler\Lexer)";

constexpr std::uint32_t kMaxInteger = 2147483647;

bool isDigit(char byte) { return byte >= '0' && byte <= '9'; }

TokenType punctuationType(char byte) {
  return std::ranges::find_if(kPunctuationMarks, [=](const Keyword& mark) { return *mark.text == byte; })->type;
}

}  // namespace

Lexer::Lexer(const ScriptTraits& traits) : vocabulary_(traits), cursor_(text_.data()), lineStart_(text_.data()) {}

void Lexer::setScript(const std::string& text) {
  text_ = text;
  cursor_ = lineStart_ = text_.data();
  line_ = 1;
}

Token Lexer::getNextToken() {
  skipBlanksAndComments();
  Token token;
  token.position = position();
  switch (classOf(*cursor_)) {
    case ByteClass::kPunctuation:
      takePunctuation(token);
      break;
    case ByteClass::kWord:
      takeWord(token);
      break;
    default:
      if (cursor_ != text_.data() + text_.size()) raiseInvalidCharacter(*cursor_);
  }
  return token;
}

SourcePosition Lexer::position() const { return {line_, static_cast<std::uint32_t>(cursor_ - lineStart_) + 1}; }

void Lexer::consumeLineFeed() {
  lineStart_ = ++cursor_;
  ++line_;
}

void Lexer::skipBlanksAndComments() {
  for (;;) {
    switch (classOf(*cursor_)) {
      case ByteClass::kBlank:
        ++cursor_;
        break;
      case ByteClass::kLineFeed:
        consumeLineFeed();
        break;
      case ByteClass::kSlash:
        skipComment();
        break;
      default:
        return;
    }
  }
}

// Stops before the line feed.
void Lexer::skipComment() {
  const char* const end = text_.data() + text_.size();
  ++cursor_;
  if (*cursor_ != '/') {
    ScriptFailure(ktwfmscriptcompiler_errors::kErrorKeywordExpectedInScript, kSource, position())
        .usage(kterr::kUsageTypeBadValue, std::string(cursor_, cursor_ == end ? 0 : 1))
        .usage(kterr::kUsageTypePossibleKeywords, kCommentKeyword)
        .raise();
  }
  const void* lineFeed = std::memchr(cursor_, '\n', static_cast<std::size_t>(end - cursor_));
  cursor_ = lineFeed == nullptr ? end : static_cast<const char*>(lineFeed);
}

void Lexer::takePunctuation(Token& token) {
  token.type = punctuationType(*cursor_);
  token.text = {cursor_, 1};
  ++cursor_;
}

void Lexer::takeWord(Token& token) {
  const char* last = cursor_;
  std::uint64_t key = 0;
  unsigned char allBits = 0;
  do {
    key = appendToWordKey(key, *last);
    allBits |= static_cast<unsigned char>(*last);
    ++last;
  } while (classOf(*last) == ByteClass::kWord);
  if (classOf(*last) == ByteClass::kInvalid && last != text_.data() + text_.size()) raiseInvalidCharacter(*last);

  token.text = {cursor_, static_cast<std::size_t>(last - cursor_)};
  const Meaning meaning = vocabulary_.find(token.text, key, allBits < 0x80);
  token.type = meaning.type;
  token.value = meaning.value;
  if (meaning.type == TokenType::kIdentifier && isDigit(*cursor_)) readNumber(token);
  cursor_ = last;
}

// Walks from the last digit to the first, so that of two faults in a word the one nearer to its end is reported.
void Lexer::readNumber(Token& token) const {
  constexpr std::uint64_t kWeightThatOverflows = 10'000'000'000;  // any digit but 0 is too much from here on
  std::uint64_t value = 0;
  std::uint64_t weight = 1;
  for (auto byte = token.text.rbegin(); byte != token.text.rend(); ++byte) {
    if (!isDigit(*byte)) {
      ScriptFailure(ktwfmscriptcompiler_errors::kErrorScriptHasInvalidIdentifier, kSource, token.position)
          .usage(kterr::kUsageTypeInvalidIdentifier, std::string(token.text))
          .raise();
    }
    value += static_cast<std::uint64_t>(*byte - '0') * weight;
    if (value > kMaxInteger) {
      ScriptFailure(ktwfmscriptcompiler_errors::kErrorIntegerExpectedInScript, kSource, token.position)
          .usage(kterr::kUsageTypeBadValue, std::string(token.text))
          .usage(kterr::kUsageTypeMinValue, std::int32_t{0})
          .usage(kterr::kUsageTypeMaxValue, static_cast<float>(kMaxInteger))
          .raise();
    }
    weight = std::min(weight * 10, kWeightThatOverflows);
  }
  token.type = TokenType::kInteger;
  token.value = static_cast<std::uint32_t>(value);
}

void Lexer::raiseInvalidCharacter(char byte) const {
  ScriptFailure(ktwfmscriptcompiler_errors::kErrorScriptHasInvalidCharacter, kSource, position())
      .usage(kterr::kUsageTypeBadValue, std::int32_t{static_cast<unsigned char>(byte)})
      .raise();
}

}  // namespace ktwfmscriptcompiler
