// The fixed words of the language: what the lexer recognises and what error reports quote.
#pragma once

#include <initializer_list>
#include <string>

#include "ktWfmScriptCompiler/Token.h"

namespace ktwfmscriptcompiler {

struct Keyword {
  TokenType type;
  const char* text;
};

// Words that no marker or trigger name can take away from the language.
inline constexpr Keyword kStrongKeywords[] = {
    {TokenType::kGenerate, "generate"}, {TokenType::kRepeat, "repeat"},   {TokenType::kEnd, "end"},
    {TokenType::kUntil, "until"},       {TokenType::kWait, "wait"},       {TokenType::kClear, "clear"},
    {TokenType::kScript, "script"},     {TokenType::kForever, "forever"}, {TokenType::kIf, "if"},
    {TokenType::kElse, "else"},         {TokenType::kBreak, "break"},     {TokenType::kOn, "on"},
};

// Words that a marker or trigger of the same name hides.
inline constexpr Keyword kWeakKeywords[] = {
    {TokenType::kSubset, "subset"},
    {TokenType::kStream, "stream"},
};

inline constexpr Keyword kPunctuationMarks[] = {
    {TokenType::kOpenParenthesis, "("},
    {TokenType::kCloseParenthesis, ")"},
    {TokenType::kComma, ","},
};

// What opens the second half of a comment's start.
inline constexpr char kCommentKeyword[] = "/";

// The text of a keyword or punctuation token; empty for the other types.
constexpr const char* keywordText(TokenType type) {
  for (const Keyword& keyword : kStrongKeywords) {
    if (keyword.type == type) return keyword.text;
  }
  for (const Keyword& keyword : kWeakKeywords) {
    if (keyword.type == type) return keyword.text;
  }
  for (const Keyword& keyword : kPunctuationMarks) {
    if (keyword.type == type) return keyword.text;
  }
  return "";
}

}  // namespace ktwfmscriptcompiler
