#include "ktWfmScriptCompiler/SequenceGenerator.h"

#include <iterator>

namespace ktwfmscriptcompiler {

namespace {

// The loop that is the whole body of the procedure and never ends, or null.
const RepeatInstruction* scriptWideLoop(const NamedProcedure& procedure) {
  if (procedure.instructions.empty()) return nullptr;
  const Instruction& first = procedure.instructions.front();
  if (first.next != nullptr || first.type != TokenType::kRepeat) return nullptr;
  const auto& repeat = downcast<RepeatInstruction>(first);
  return repeat.repeatType == RepeatType::kForever ? &repeat : nullptr;
}

}  // namespace

SequenceGenerator::SequenceGenerator(const ScriptTraits&, NestingPoliciesInterface& nesting,
                                     InstructionContainerTranslatorInterface& containerTranslator,
                                     const InstructionValidatorInterface& validator)
    : nesting_(nesting), containerTranslator_(containerTranslator), validator_(validator) {}

void SequenceGenerator::generate(const iParseTree& root, std::vector<CompiledScript>& scripts, SourceMap* map) {
  const auto& tree = downcast<ProcedureCollection>(root);
  scripts.resize(static_cast<std::size_t>(std::distance(tree.procedures.begin(), tree.procedures.end())));
  auto script = scripts.begin();
  for (const NamedProcedure& procedure : tree.procedures) generateProcedure(procedure, *script++);
  if (map != nullptr) *map = mapSource(tree, scripts);
}

void SequenceGenerator::generateProcedure(const NamedProcedure& procedure, CompiledScript& script) {
  nesting_.reset();
  nesting_.enterProcedure(procedure);
  containerTranslator_.dropPendingClearFlags();
  script.name = procedure.name;
  const RepeatInstruction* loop = scriptWideLoop(procedure);
  script.isEndless = loop != nullptr;
  if (loop == nullptr) {
    containerTranslator_.translate(procedure, script.blocks);
  } else {
    generateEndless(*loop, script);
  }
  nesting_.leaveProcedure();
}

// The loop leaves no block of its own: the whole script repeats.
void SequenceGenerator::generateEndless(const RepeatInstruction& loop, CompiledScript& script) {
  nesting_.enterScriptLoop(loop);
  containerTranslator_.translate(loop, script.blocks);
  validator_.checkClearNotLastInLoop(loop, containerTranslator_.getPendingClearFlags());
  nesting_.leaveScriptLoop();
}

}  // namespace ktwfmscriptcompiler
