// Translates one instruction, and carries the trigger-clear flags of clears to the fetch or loop that follows.
// Belongs to the thread that translates.
#pragma once

#include "ktWfmScriptCompiler/FetchInstructionTranslator.h"
#include "ktWfmScriptCompiler/InstructionContainerNestingPolicies.h"
#include "ktWfmScriptCompiler/InstructionValidator.h"
#include "ktWfmScriptCompiler/ScriptSink.h"

namespace ktwfmscriptcompiler {

class InstructionContainerTranslatorInterface;

class InstructionTranslatorInterface {
 public:
  virtual ~InstructionTranslatorInterface() = default;

  // Append one fetch to `block`, with the pending clear flags, of which none are left then.
  virtual void translateGenerate(const GenerateInstruction& generate, SequenceBlock& block) = 0;
  // Appends the one block of the loop. The body starts with no flags pending; those that were go to the block.
  virtual void translateRepeat(const RepeatInstruction& repeat, InstructionContainerTranslatorInterface& body,
                               ScriptSink& script) = 0;
  virtual void translateWaitUntil(const WaitInstruction& wait, SequenceBlock& block) = 0;
  virtual void translateWait(const WaitInstruction& wait, SequenceBlock& block) = 0;

  // Adds the triggers to the pending clear flags.
  virtual void translateClear(const ClearInstruction& clear) = 0;

  // The hardware trigger 1..8 of a table number 0..7; raises ktmxl::kErrorSoftwareFault for any other.
  virtual std::uint8_t toHardwareTrigger(std::uint32_t tableNumber) const = 0;

  virtual void setPendingClearFlags(std::uint8_t flags) = 0;
  virtual std::uint8_t getPendingClearFlags() const = 0;
};

class InstructionTranslator final : public InstructionTranslatorInterface {
 public:
  // Borrows all four; they must outlive the translator.
  InstructionTranslator(const ScriptTraits& traits, NestingPoliciesInterface& nesting,
                        FetchInstructionTranslatorInterface& fetchTranslator,
                        const InstructionValidatorInterface& validator);
  InstructionTranslator(const InstructionTranslator&) = delete;
  InstructionTranslator& operator=(const InstructionTranslator&) = delete;

  void translateGenerate(const GenerateInstruction& generate, SequenceBlock& block) override;
  void translateRepeat(const RepeatInstruction& repeat, InstructionContainerTranslatorInterface& body,
                       ScriptSink& script) override;
  void translateWaitUntil(const WaitInstruction& wait, SequenceBlock& block) override;
  void translateWait(const WaitInstruction& wait, SequenceBlock& block) override;
  void translateClear(const ClearInstruction& clear) override;
  std::uint8_t toHardwareTrigger(std::uint32_t tableNumber) const override;
  void setPendingClearFlags(std::uint8_t flags) override { pendingClearFlags_ = flags; }
  std::uint8_t getPendingClearFlags() const override { return pendingClearFlags_; }

 private:
  void setLoop(const RepeatInstruction& repeat, SequenceBlock& block) const;

  const ScriptTraits& traits_;
  NestingPoliciesInterface& nesting_;
  FetchInstructionTranslatorInterface& fetchTranslator_;
  const InstructionValidatorInterface& validator_;
  std::uint8_t pendingClearFlags_ = 0;  // bit h-1: hardware trigger h
};

}  // namespace ktwfmscriptcompiler
