#include "ktWfmScriptCompiler/InstructionContainerNestingPolicies.h"

#include "ktWfmScriptCompiler/ScriptFailure.h"

namespace ktwfmscriptcompiler {
namespace {

constexpr char kSource[] = R"(ktWfmScriptCompiler\InstructionContainerNestingPolicies)";

}  // namespace

void InstructionContainerNestingPolicies::reset() { *this = {}; }

void InstructionContainerNestingPolicies::enterProcedure(const iParseTree& procedure) {
  procedure_ = procedure.position();
}

void InstructionContainerNestingPolicies::leaveProcedure() { procedure_ = {}; }

void InstructionContainerNestingPolicies::enterScriptLoop(const iParseTree& loop) { scriptLoop_ = loop.position(); }

void InstructionContainerNestingPolicies::leaveScriptLoop() { scriptLoop_.reset(); }

void InstructionContainerNestingPolicies::enterRepeatLoop(const iParseTree& loop) {
  if (repeatLoop_) {
    ScriptFailure(ktwfmscriptcompiler_errors::kErrorRepeatLoopNestingTooDeepInScript, kSource, loop.position()).raise();
  }
  repeatLoop_ = loop.position();
}

void InstructionContainerNestingPolicies::leaveRepeatLoop() { repeatLoop_.reset(); }

std::uint32_t InstructionContainerNestingPolicies::getLineNumber() const { return innermost().line; }

std::uint32_t InstructionContainerNestingPolicies::getPositionInLine() const { return innermost().positionInLine; }

SourcePosition InstructionContainerNestingPolicies::innermost() const {
  return repeatLoop_.value_or(scriptLoop_.value_or(procedure_));
}

}  // namespace ktwfmscriptcompiler
