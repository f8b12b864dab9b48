// Walks one sequence of instructions and cuts it into blocks: every loop owns one, and the fetches between loops
// gather into plain blocks that play once. Belongs to the thread that translates.
#pragma once

#include "ktWfmScriptCompiler/InstructionTranslator.h"

namespace ktwfmscriptcompiler {

class InstructionContainerTranslatorInterface {
 public:
  virtual ~InstructionContainerTranslatorInterface() = default;

  // Appends the blocks of `container`. Raises the error of the first instruction that breaks a rule.
  virtual void translate(const InstructionContainer& container, ScriptSink& script) = 0;

  // The flags of clears behind which no fetch has followed yet, bit h-1 for hardware trigger h.
  virtual std::uint8_t getPendingClearFlags() const = 0;

  // Forgets those flags: what one script clears never reaches another one.
  virtual void dropPendingClearFlags() = 0;
};

class InstructionContainerTranslator final : public InstructionContainerTranslatorInterface {
 public:
  // Borrows all but the traits, which cutting blocks needs nothing of; they must outlive the translator.
  InstructionContainerTranslator(const ScriptTraits& traits, const NestingPoliciesInterface& nesting,
                                 InstructionTranslatorInterface& instructionTranslator,
                                 const InstructionValidatorInterface& validator);
  InstructionContainerTranslator(const InstructionContainerTranslator&) = delete;
  InstructionContainerTranslator& operator=(const InstructionContainerTranslator&) = delete;

  void translate(const InstructionContainer& container, ScriptSink& script) override;
  std::uint8_t getPendingClearFlags() const override;
  void dropPendingClearFlags() override;

 private:
  void translateWait(const WaitInstruction& wait, SequenceBlock& block);

  const NestingPoliciesInterface& nesting_;
  InstructionTranslatorInterface& instructionTranslator_;
  const InstructionValidatorInterface& validator_;
};

}  // namespace ktwfmscriptcompiler
