// The grammar, read with one token of lookahead. Keywords in quotes, in any letter case:
//
//   text         procedure { procedure }
//   procedure    "script" NAME instruction { instruction } "end" "script"
//   instruction  generate | wait | repeat | clear
//   generate     "generate" NAME [ "subset" "(" INTEGER "," INTEGER ")" ] { marker }
//   wait         "wait" ( INTEGER | "until" TRIGGER ) { marker }
//   repeat       "repeat" ( INTEGER | "forever" | "until" TRIGGER ) instruction { instruction } "end" "repeat"
//   clear        "clear" TRIGGER { TRIGGER }
//   marker       MARKER "(" INTEGER { "," INTEGER } ")"
//
// NAME is any word, a keyword, marker name or trigger name included. Internal: use ParserFactory.
#pragma once

#include <memory>
#include <new>
#include <string>
#include <vector>

#include "ktWfmScriptCompiler/Parser.h"
#include "ktWfmScriptCompiler/ScriptTraits.h"

namespace ktwfmscriptcompiler {

class ParserImpl {
 public:
  // Borrows both; they must outlive the parser.
  ParserImpl(const ScriptTraits& traits, LexerInterface* lexer);
  virtual ~ParserImpl() = default;

  // As ParserInterface::parse.
  virtual std::unique_ptr<iParseTree> parse(const std::string& text);

 private:
  void parseProcedureCollection();
  NamedProcedure& parseNamedProcedure();
  void parseInstructions(InstructionContainer& body);
  void parseInstruction(InstructionContainer& container, std::vector<InstructionContainer*>& openContainers);
  GenerateInstruction& parseGenerate();
  SubsetModifier& parseSubset();
  void parseMarkers(FetchInstruction& fetch);
  MarkerModifier& parseMarker();
  WaitInstruction& parseWait();
  RepeatInstruction& parseRepeat();  // up to its body
  ClearInstruction& parseClear();
  std::string_view parseName();
  std::uint32_t parseInteger();
  std::uint32_t parseTriggerNumber();

  void advance() { ::new (&currentToken_) Token(lexer_->getNextToken()); }
  bool at(TokenType type) const { return currentToken_.type == type; }
  bool matchToken(TokenType type);
  void expect(TokenType type);
  bool startsInstruction() const;
  bool isWordToken() const;
  std::uint32_t takeValue();
  template <typename Node>
  Node& createNode();
  [[noreturn]] void raiseKeywordExpected(const std::string& possibleKeywords) const;

  const ScriptTraits& traits_;
  LexerInterface* lexer_;
  Token currentToken_;
  ProcedureCollection* tree_ = nullptr;  // the tree being built, during parse only
  std::vector<std::uint32_t> numbers_;   // scratch for the numbers of one marker or clear
};

}  // namespace ktwfmscriptcompiler
