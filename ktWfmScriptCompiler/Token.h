// The words of the script language.
#pragma once

#include <cstdint>
#include <string_view>

#include "ktWfmScriptCompiler/SourcePosition.h"

namespace ktwfmscriptcompiler {

// The numbers are frozen: an instruction of the parse tree records its kind as the type of its keyword.
enum class TokenType : std::uint32_t {
  kIdentifier = 0,  // a word that is nothing else
  kScript = 1,
  kEnd = 2,
  kGenerate = 3,
  kSubset = 4,
  kRepeat = 5,
  kForever = 6,
  kUntil = 7,
  kWait = 8,
  kClear = 9,
  kInteger = 10,  // decimal, at most 2147483647
  kMarkerName = 11,
  kTriggerName = 12,
  kOpenParenthesis = 13,
  kCloseParenthesis = 14,
  kComma = 15,
  kEndOfScript = 16,
  kIf = 17,  // the last five are reserved words; no instruction starts with them
  kElse = 18,
  kBreak = 19,
  kOn = 20,
  kStream = 21,
};

struct Token {
  TokenType type = TokenType::kEndOfScript;
  std::string_view text;    // as written, empty at the end of the script; valid until the lexer's next setScript
  std::uint32_t value = 0;  // the number of an integer, the table number of a marker or trigger name, else 0
  SourcePosition position;  // of the first byte
};

}  // namespace ktwfmscriptcompiler
