#include "ktWfmScriptCompiler/ParseTree.h"

#include "kterr/Failure.h"

namespace ktwfmscriptcompiler {

void raiseWrongNode() { kterr::Failure(ktmxl::kErrorSoftwareFault).at(R"(ktWfmScriptCompiler\ParseTree)").raise(); }

const RepeatInstruction* scriptWideLoop(const NamedProcedure& procedure) {
  if (procedure.instructions.empty()) return nullptr;
  const Instruction& first = procedure.instructions.front();
  if (first.next != nullptr || first.type != TokenType::kRepeat) return nullptr;
  const auto& repeat = downcast<RepeatInstruction>(first);
  return repeat.repeatType == RepeatType::kForever ? &repeat : nullptr;
}

}  // namespace ktwfmscriptcompiler
