// From parse tree to compiled scripts: the front of the compiler's back end. Belongs to the thread that translates.
#pragma once

#include "ktWfmScriptCompiler/InstructionContainerTranslator.h"

namespace ktwfmscriptcompiler {

class SequenceGenerator {
 public:
  // Borrows all but the traits, which it needs nothing of; they must outlive the generator.
  SequenceGenerator(const ScriptTraits& traits, NestingPoliciesInterface& nesting,
                    InstructionContainerTranslatorInterface& containerTranslator,
                    const InstructionValidatorInterface& validator);
  virtual ~SequenceGenerator() = default;
  SequenceGenerator(const SequenceGenerator&) = delete;
  SequenceGenerator& operator=(const SequenceGenerator&) = delete;

  // Gives `scripts` one script per procedure of `root`, a ProcedureCollection. Raises the error of the first
  // instruction that breaks a rule: discard then what `scripts` has got.
  virtual void generate(const iParseTree& root, ScriptSink& scripts);
  virtual void generateProcedure(const NamedProcedure& procedure, ScriptSink& script);

 private:
  void generateEndless(const RepeatInstruction& loop, ScriptSink& script);

  NestingPoliciesInterface& nesting_;
  InstructionContainerTranslatorInterface& containerTranslator_;
  const InstructionValidatorInterface& validator_;
};

}  // namespace ktwfmscriptcompiler
