// From parse tree to compiled scripts: the front of the compiler's back end. Belongs to the thread that translates.
#pragma once

#include <vector>

#include "ktWfmScriptCompiler/InstructionContainerTranslator.h"
#include "ktWfmScriptCompiler/SourceMap.h"

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

  // Appends one script per procedure of `root`, a ProcedureCollection, to `scripts`, which is empty; fills `map`
  // when there is one. Raises the error of the first instruction that breaks a rule: discard `scripts` then.
  virtual void generate(const iParseTree& root, std::vector<CompiledScript>& scripts, SourceMap* map = nullptr);
  virtual void generateProcedure(const NamedProcedure& procedure, CompiledScript& script);

 private:
  void generateEndless(const RepeatInstruction& loop, CompiledScript& script);

  NestingPoliciesInterface& nesting_;
  InstructionContainerTranslatorInterface& containerTranslator_;
  const InstructionValidatorInterface& validator_;
};

}  // namespace ktwfmscriptcompiler
