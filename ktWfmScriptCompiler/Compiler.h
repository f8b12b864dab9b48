// The compiler: script text in, compiled scripts out. It owns the stages, wired to one another, and keeps nothing else
// between texts. One thread at a time.
#pragma once

#include <memory>
#include <string>

#include "ktWfmScriptCompiler/Parser.h"
#include "ktWfmScriptCompiler/ScriptSink.h"
#include "ktWfmScriptCompiler/ScriptTraits.h"
#include "ktWfmScriptCompiler/SequenceGenerator.h"

namespace ktwfmscriptcompiler {

class Compiler {
 public:
  // Borrows the traits, which must outlive the compiler. Their name tables are read here, their two numbers by each
  // text.
  explicit Compiler(const ScriptTraits& traits);
  Compiler(const Compiler&) = delete;
  Compiler& operator=(const Compiler&) = delete;

  // Gives `scripts` one script per script of `text`, in text order. Raises the first error: of the text's words and
  // grammar, else of its rules. Discard then what `scripts` has got.
  void compile(const std::string& text, ScriptSink& scripts) { translate(*parser_->parse(text), scripts); }

  // The second half, for a tree made in another way. Raises ktmxl::kErrorSoftwareFault for one that no text gives.
  void translate(const iParseTree& tree, ScriptSink& scripts) { sequenceGenerator_.generate(tree, scripts); }

 private:
  InstructionContainerNestingPolicies nesting_;
  std::unique_ptr<ParserInterface> parser_;
  InstructionValidator validator_;
  FetchInstructionTranslator fetchTranslator_;
  InstructionTranslator instructionTranslator_;
  InstructionContainerTranslator containerTranslator_;
  SequenceGenerator sequenceGenerator_;
};

}  // namespace ktwfmscriptcompiler
