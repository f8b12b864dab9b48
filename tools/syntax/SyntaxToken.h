// The tokens of a text that may have faults. Blanks and comments are what lies between them.
#pragma once

#include <cstdint>

#include "ktWfmScriptCompiler/Token.h"

namespace tools {

using ktwfmscriptcompiler::TokenType;

// What is wrong with a token in itself; each is an error of the compiler's lexer.
enum class TokenFault : std::uint8_t {
  kNone,
  kBadCharacter,  // a byte that no word holds
  kLoneSlash,
  kNoName,   // begins with a digit and is no number
  kTooLarge  // a number above 2147483647
};

// Eight bytes, since texts have millions of them. A token with a fault is of type kInteger where it begins as a number
// does, else kIdentifier.
class SyntaxToken {
 public:
  static constexpr std::uint32_t kLongest = (1u << 23) - 1;

  // `length` is at most kLongest, which stands for that many bytes or more; `offset` counts from the text's start.
  constexpr SyntaxToken(std::uint32_t offset, std::uint32_t length, TokenType type, TokenFault fault,
                        bool isFirstOfLine)
      : offset_(offset),
        bits_(length | static_cast<std::uint32_t>(type) << 23 | static_cast<std::uint32_t>(fault) << 28 |
              (isFirstOfLine ? 1u : 0u) << 31) {}

  std::uint32_t offset() const { return offset_; }
  std::uint32_t length() const { return bits_ & kLongest; }
  TokenType type() const { return static_cast<TokenType>(bits_ >> 23 & 31); }
  TokenFault fault() const { return static_cast<TokenFault>(bits_ >> 28 & 7); }
  bool isFirstOfLine() const { return bits_ >> 31 != 0; }

 private:
  std::uint32_t offset_;
  std::uint32_t bits_;
};

}  // namespace tools
