#include "ktWfmScriptCompiler/InstructionContainerTranslator.h"

#include "kterr/Failure.h"

namespace ktwfmscriptcompiler {
namespace {

constexpr char kSource[] = R"(ktWfmScriptCompiler\InstructionContainerTranslator)";

// The fetches that one plain block takes, from `first` on.
std::size_t countFetchesOfBlock(const Instruction* first) {
  std::size_t count = 0;
  for (; first != nullptr && first->type != TokenType::kRepeat; first = first->next) {
    if (first->type != TokenType::kClear) ++count;
  }
  return count;
}

}  // namespace

InstructionContainerTranslator::InstructionContainerTranslator(const ScriptTraits&,
                                                               const NestingPoliciesInterface& nesting,
                                                               InstructionTranslatorInterface& instructionTranslator,
                                                               const InstructionValidatorInterface& validator)
    : nesting_(nesting), instructionTranslator_(instructionTranslator), validator_(validator) {}

void InstructionContainerTranslator::translate(const InstructionContainer& container, ScriptSink& script) {
  validator_.checkContainerGeneratesSamples(container, nesting_);
  bool needsBlock = true;
  const auto blockFor = [&](const Instruction& fetch) -> SequenceBlock& {
    if (needsBlock) script.appendBlock(fetch.place(), countFetchesOfBlock(&fetch));
    needsBlock = false;
    script.placeFetch(fetch.place());
    return script.lastBlock();
  };
  for (const Instruction& instruction : container.instructions) {
    switch (instruction.type) {
      case TokenType::kGenerate:
        instructionTranslator_.translateGenerate(downcast<GenerateInstruction>(instruction), blockFor(instruction));
        break;
      case TokenType::kWait:
        translateWait(downcast<WaitInstruction>(instruction), blockFor(instruction));
        break;
      case TokenType::kRepeat:
        instructionTranslator_.translateRepeat(downcast<RepeatInstruction>(instruction), *this, script);
        needsBlock = true;
        break;
      case TokenType::kClear:
        instructionTranslator_.translateClear(downcast<ClearInstruction>(instruction));
        break;
      default:
        kterr::Failure(ktmxl::kErrorSoftwareFault).at(kSource).raise();
    }
  }
}

void InstructionContainerTranslator::translateWait(const WaitInstruction& wait, SequenceBlock& block) {
  if (wait.waitType == WaitType::kUntilTrigger) {
    instructionTranslator_.translateWaitUntil(wait, block);
  } else {
    instructionTranslator_.translateWait(wait, block);
  }
}

std::uint8_t InstructionContainerTranslator::getPendingClearFlags() const {
  return instructionTranslator_.getPendingClearFlags();
}

void InstructionContainerTranslator::dropPendingClearFlags() { instructionTranslator_.setPendingClearFlags(0); }

}  // namespace ktwfmscriptcompiler
