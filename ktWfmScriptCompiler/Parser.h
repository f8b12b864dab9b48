// From script text to parse tree: checks the grammar and nothing else. A parser serves one thread at a time.
#pragma once

#include <memory>
#include <string>

#include "ktWfmScriptCompiler/Lexer.h"
#include "ktWfmScriptCompiler/ParseTree.h"

namespace ktwfmscriptcompiler {

class ParserImpl;

class ParserInterface {
 public:
  virtual ~ParserInterface() = default;

  // Parses the scripts of `text`, up to the first "end script" that no further script follows; the token behind it
  // is read, the rest is not. Returns the root, a ProcedureCollection; deleting it frees the tree.
  // Raises the lexer's errors, kErrorKeywordExpectedInScript, kErrorScriptHasInvalidIdentifier and
  // kErrorIntegerExpectedInScript at the first token that does not fit.
  // May be called any number of times; no call sees anything of an earlier one.
  virtual std::unique_ptr<iParseTree> parse(const std::string& text) = 0;
};

class Parser final : public ParserInterface {
 public:
  Parser(std::shared_ptr<ParserImpl> impl, std::shared_ptr<LexerInterface> lexer);

  std::unique_ptr<iParseTree> parse(const std::string& text) override;

 private:
  std::shared_ptr<LexerInterface> lexer_;
  std::shared_ptr<ParserImpl> impl_;
};

}  // namespace ktwfmscriptcompiler
