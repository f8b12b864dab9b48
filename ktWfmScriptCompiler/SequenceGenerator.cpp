#include "ktWfmScriptCompiler/SequenceGenerator.h"

namespace ktwfmscriptcompiler {

SequenceGenerator::SequenceGenerator(const ScriptTraits&, NestingPoliciesInterface& nesting,
                                     InstructionContainerTranslatorInterface& containerTranslator,
                                     const InstructionValidatorInterface& validator)
    : nesting_(nesting), containerTranslator_(containerTranslator), validator_(validator) {}

void SequenceGenerator::generate(const iParseTree& root, ScriptSink& scripts) {
  const auto& tree = downcast<ProcedureCollection>(root);
  for (const NamedProcedure& procedure : tree.procedures) generateProcedure(procedure, scripts);
}

void SequenceGenerator::generateProcedure(const NamedProcedure& procedure, ScriptSink& script) {
  nesting_.reset();
  nesting_.enterProcedure(procedure);
  containerTranslator_.dropPendingClearFlags();
  const RepeatInstruction* const loop = scriptWideLoop(procedure);
  script.startScript(procedure.name, loop != nullptr, procedure.place());
  if (loop == nullptr) {
    containerTranslator_.translate(procedure, script);
  } else {
    generateEndless(*loop, script);
  }
  script.endScript();
  nesting_.leaveProcedure();
}

// The loop leaves no block of its own: the whole script repeats.
void SequenceGenerator::generateEndless(const RepeatInstruction& loop, ScriptSink& script) {
  nesting_.enterScriptLoop(loop);
  containerTranslator_.translate(loop, script);
  validator_.checkClearNotLastInLoop(loop, containerTranslator_.getPendingClearFlags());
  nesting_.leaveScriptLoop();
}

}  // namespace ktwfmscriptcompiler
