// Cuts a text into tokens one by one, and never fails: what the compiler's lexer refuses becomes a token with a fault.
// It reads the same byte classes and the same vocabulary. One thread at a time.
#pragma once

#include <string_view>

#include "ktWfmScriptCompiler/Vocabulary.h"
#include "tools/syntax/SyntaxToken.h"

namespace tools {

class Scanner {
 public:
  // Borrows both for its life. A text has less than 4 GiB.
  Scanner(std::string_view text, const ktwfmscriptcompiler::Vocabulary& vocabulary)
      : text_(text), vocabulary_(vocabulary) {}

  // At the end of the text kEndOfScript, again and again.
  SyntaxToken next();

 private:
  void skipToToken();
  void skipLine();
  SyntaxToken takeWord();
  SyntaxToken takeSlash();
  SyntaxToken make(std::size_t end, TokenType type, TokenFault fault = TokenFault::kNone);
  bool at(std::size_t place, std::string_view bytes) const { return text_.substr(place, bytes.size()) == bytes; }

  std::string_view text_;
  const ktwfmscriptcompiler::Vocabulary& vocabulary_;
  std::size_t cursor_ = 0;
  bool isFirstOfLine_ = true;
};

// The end of the word, right or wrong, that begins at `start`.
std::size_t endOfChunk(std::string_view text, std::size_t start);

}  // namespace tools
