// The rules that words and grammar cannot express, asked of every instruction that has no other fault. The compiler's
// own classes judge, one instruction at a time, so that one failure does not hide the next.
#pragma once

#include <cstdint>
#include <vector>

#include "ktWfmScriptCompiler/FetchInstructionTranslator.h"
#include "ktWfmScriptCompiler/InstructionContainerNestingPolicies.h"
#include "ktWfmScriptCompiler/InstructionTranslator.h"
#include "ktWfmScriptCompiler/Vocabulary.h"
#include "tools/diagnostics/json.h"
#include "tools/syntax/SyntaxTree.h"

namespace tools {

struct RuleFault {
  std::uint32_t token = 0;          // where the compiler reports it
  std::uint32_t opener = kNoIndex;  // of kErrorRepeatLoopNestingTooDeepInScript: the loop outside
  std::int32_t code = 0;
  ElaborationRecord record;  // with the values
};

class RuleChecker {
 public:
  // Borrows both.
  RuleChecker(const SyntaxTree& tree, const ktwfmscriptcompiler::ScriptTraits& traits);

  // The faults of the script at that node, in the order of the compiler, at most `most`. What stands in front of the
  // script's first fault of words or grammar is left out: the compiler reports that one first.
  std::vector<RuleFault> check(std::uint32_t scriptNode, std::size_t most);

 private:
  struct OpenLoop {
    std::uint32_t node;
    bool isTooDeep;
  };

  template <typename Check>
  bool passes(std::uint32_t token, Check check, std::uint32_t opener = kNoIndex);
  void checkInstruction(std::uint32_t node);
  void checkGenerate(std::uint32_t node);
  void checkWait(std::uint32_t node);
  void enterLoop(std::uint32_t node);
  void leaveLoop(const OpenLoop& loop);
  void checkPlaysSamples(std::uint32_t container);
  bool hasFault(std::uint32_t node) const;
  bool playsSamples(std::uint32_t node) const;
  std::uint32_t findScriptWideLoop() const;
  std::vector<std::uint32_t> numbersOf(std::uint32_t node) const;
  const SyntaxNode& at(std::uint32_t node) const { return tree_.nodes()[node]; }
  ktwfmscriptcompiler::TokenType typeOf(std::uint32_t token) const { return tree_.tokens()[token].type(); }

  const SyntaxTree& tree_;
  const ktwfmscriptcompiler::ScriptTraits& traits_;
  ktwfmscriptcompiler::Vocabulary vocabulary_;
  ktwfmscriptcompiler::InstructionContainerNestingPolicies nesting_;
  ktwfmscriptcompiler::InstructionValidator validator_;
  ktwfmscriptcompiler::FetchInstructionTranslator fetchTranslator_;
  ktwfmscriptcompiler::InstructionTranslator translator_;
  std::uint32_t script_ = 0;           // node
  std::uint32_t wideLoop_ = kNoIndex;  // node
  std::uint32_t firstToken_ = 0;       // to be judged
  std::size_t most_ = 0;
  std::vector<OpenLoop> loops_;
  std::vector<RuleFault> faults_;
};

}  // namespace tools
