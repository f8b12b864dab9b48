// Faults in words for those who wrote the script: a headline of its own for each, what would be right, and where the
// other end of it stands. The library's own texts stay as they are; these are of the tools alone.
#pragma once

#include "ktWfmScriptCompiler/ScriptTraits.h"
#include "tools/check/RuleChecker.h"
#include "tools/diagnostics/Diagnostic.h"
#include "tools/syntax/SyntaxTree.h"

namespace tools {

class FaultDescriber {
 public:
  // Borrows all three. `sampleRateHz` is what times are explained with.
  FaultDescriber(const ScriptFile& file, const SyntaxTree& tree, const ktwfmscriptcompiler::ScriptTraits& traits,
                 double sampleRateHz)
      : file_(file), tree_(tree), traits_(traits), sampleRateHz_(sampleRateHz) {}

  Diagnostic describe(const SyntaxFault& fault) const;
  Diagnostic describe(const RuleFault& fault) const;

 private:
  void describeToken(const SyntaxFault& fault, Diagnostic& diagnostic) const;
  void describeCharacter(const SyntaxFault& fault, Diagnostic& diagnostic) const;
  void describeGrammar(const SyntaxFault& fault, Diagnostic& diagnostic) const;
  void describeStranger(const SyntaxFault& fault, Diagnostic& diagnostic) const;
  void describeMissingEnd(const SyntaxFault& fault, Diagnostic& diagnostic) const;
  void describeEnd(const SyntaxFault& fault, Diagnostic& diagnostic) const;
  void describeMark(const SyntaxFault& fault, Diagnostic& diagnostic) const;
  bool describeLookalike(const SyntaxFault& fault, Diagnostic& diagnostic) const;
  bool adviseOnNumber(std::uint32_t token, Diagnostic& diagnostic) const;
  void suggest(const SyntaxFault& fault, Diagnostic& diagnostic) const;
  const char* kindOf(const std::string& word) const;
  void relateOpener(std::uint32_t opener, Diagnostic& diagnostic) const;

  std::string quoted(std::uint32_t token) const;
  // "loop" or "script", for its keyword.
  const char* nameOfBody(std::uint32_t keyword) const;
  TokenType typeOf(std::uint32_t token) const { return tree_.tokens()[token].type(); }
  bool isAtEnd(const SyntaxFault& fault) const { return typeOf(fault.token) == TokenType::kEndOfScript; }
  Diagnostic::Fix replace(std::uint32_t token, std::string text, bool isCertain) const;

  const ScriptFile& file_;
  const SyntaxTree& tree_;
  const ktwfmscriptcompiler::ScriptTraits& traits_;
  double sampleRateHz_;
};

}  // namespace tools
