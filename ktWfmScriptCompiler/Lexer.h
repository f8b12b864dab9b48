// Cuts a script text into tokens and keeps the line and position of each. Raises the character-level and word-level
// errors of the language. A lexer serves one thread at a time.
#pragma once

#include <string>

#include "ktWfmScriptCompiler/ByteClass.h"
#include "ktWfmScriptCompiler/Token.h"
#include "ktWfmScriptCompiler/Vocabulary.h"

namespace ktwfmscriptcompiler {

class LexerInterface {
 public:
  virtual ~LexerInterface() = default;

  // Starts over on a copy of `text`. Ends the life of the texts of all tokens handed out so far.
  virtual void setScript(const std::string& text) = 0;

  // Returns the next token; at the end of the text kEndOfScript, again and again.
  // Raises kErrorKeywordExpectedInScript for a lone "/", kErrorScriptHasInvalidCharacter for a byte that no word
  // holds, kErrorScriptHasInvalidIdentifier for a word that begins with a digit and is no number, and
  // kErrorIntegerExpectedInScript for a number above 2147483647. Only setScript makes it usable again then.
  virtual Token getNextToken() = 0;
};

class Lexer final : public LexerInterface {
 public:
  // The name tables of `traits` must outlive the lexer, unchanged.
  explicit Lexer(const ScriptTraits& traits);
  Lexer(const Lexer&) = delete;
  Lexer& operator=(const Lexer&) = delete;

  void setScript(const std::string& text) override;
  Token getNextToken() override;

 private:
  SourcePosition position() const;
  // Both return the class of the byte they stop at.
  ByteClass skipWhitespaceAndComments();
  ByteClass skipWhitespace();
  void consumeLineFeed();
  void skipComment();
  Token takePunctuation(ByteClass punctuation);
  Token takeWord();
  Token takeAnyWord();
  Token takeNumber();
  bool endsWord(const char* place) const;
  void classifyWord(Token& word) const;
  [[noreturn]] void raiseInvalidCharacter(char byte) const;

  Vocabulary vocabulary_;
  std::string text_;       // with kScanBytes NULs behind it, for reading eight bytes at a time
  const char* end_;        // behind the script, before those
  const char* cursor_;     // next unread byte
  const char* lineStart_;  // first byte of the cursor's line; positions are distances from here, plus 1
  std::uint32_t line_;
};

}  // namespace ktwfmscriptcompiler
