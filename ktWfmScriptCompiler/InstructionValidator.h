// The rules of the language that the grammar cannot express: one operation per rule, called by the translators in the
// order of translation. Each returns, or raises the error named with it at the line and position of the construct.
// Keeps nothing between calls; any thread may call.
#pragma once

#include <span>

#include "ktWfmScriptCompiler/CompiledScript.h"
#include "ktWfmScriptCompiler/InstructionContainerNestingPolicies.h"
#include "ktWfmScriptCompiler/ParseTree.h"
#include "ktWfmScriptCompiler/ScriptTraits.h"

namespace ktwfmscriptcompiler {

// The marker records of one fetch, ascending by position.
using MarkerList = std::span<const MarkerRecord>;

class InstructionValidatorInterface {
 public:
  virtual ~InstructionValidatorInterface() = default;

  // Something in the container itself plays samples: a generate, a repeat or a counted wait.
  // kErrorLoopOrProcedureWithNoSamplesGenerated, at the innermost construct that `nesting` knows.
  virtual void checkContainerGeneratesSamples(const InstructionContainer& container,
                                              const NestingPoliciesInterface& nesting) const = 0;

  // A subset, if any, is 1 to 2147483647 samples long. kErrorInvalidSubsetLengthInScript.
  virtual void checkSubsetLength(const GenerateInstruction& generate) const = 0;

  // kErrorMarkerNotSupportedInWait.
  virtual void checkNoMarkersInWaitUntil(const WaitInstruction& wait) const = 0;

  // No clear flags are pending behind a loop's body. kErrorClearIsLastInstructionOfLoopInScript, at the body's last
  // instruction.
  virtual void checkClearNotLastInLoop(const RepeatInstruction& repeat, std::uint8_t pendingClearFlags) const = 0;

  // A counted loop runs 1 to 2147483647 times. kErrorInvalidLoopIterationsInScript.
  virtual void checkLoopIterations(const RepeatInstruction& repeat) const = 0;

  // A counted wait reaches the hardware's minimum. kErrorNumSampsToWaitNotGreaterThanMinWaitLengthInScript.
  virtual void checkMinWaitLength(const WaitInstruction& wait) const = 0;

  // The last marker lies before the end of the fetch. kErrorMarkerPositionOutsideSubsetInScript.
  virtual void checkMarkersInsideFetch(const FetchInstruction& fetch, std::uint32_t lengthSamples,
                                       MarkerList markers) const = 0;

  // kErrorMarkerPositionNotMultipleOfQuantum, for the first misaligned position.
  virtual void checkMarkerPositionsAligned(const FetchInstruction& fetch, MarkerList markers) const = 0;

  // kErrorSubsetLengthNotMultipleOfQuantum. kWholeWaveform passes.
  virtual void checkFetchLengthAligned(const FetchInstruction& fetch, std::uint32_t lengthSamples) const = 0;

  // kErrorStartOffsetNotMultipleOfQuantum.
  virtual void checkStartOffsetAligned(const FetchInstruction& fetch, std::uint32_t offsetSamples) const = 0;

  // kErrorNumSamplesToWaitNotMultipleOfQuantum.
  virtual void checkWaitLengthAligned(const WaitInstruction& wait) const = 0;
};

class InstructionValidator final : public InstructionValidatorInterface {
 public:
  // Borrows the traits, which must outlive the validator, and reads their two numbers at each check.
  explicit InstructionValidator(const ScriptTraits& traits);
  InstructionValidator(const InstructionValidator&) = delete;
  InstructionValidator& operator=(const InstructionValidator&) = delete;

  void checkContainerGeneratesSamples(const InstructionContainer& container,
                                      const NestingPoliciesInterface& nesting) const override;
  void checkSubsetLength(const GenerateInstruction& generate) const override;
  void checkNoMarkersInWaitUntil(const WaitInstruction& wait) const override;
  void checkClearNotLastInLoop(const RepeatInstruction& repeat, std::uint8_t pendingClearFlags) const override;
  void checkLoopIterations(const RepeatInstruction& repeat) const override;
  void checkMinWaitLength(const WaitInstruction& wait) const override;
  void checkMarkersInsideFetch(const FetchInstruction& fetch, std::uint32_t lengthSamples,
                               MarkerList markers) const override;
  void checkMarkerPositionsAligned(const FetchInstruction& fetch, MarkerList markers) const override;
  void checkFetchLengthAligned(const FetchInstruction& fetch, std::uint32_t lengthSamples) const override;
  void checkStartOffsetAligned(const FetchInstruction& fetch, std::uint32_t offsetSamples) const override;
  void checkWaitLengthAligned(const WaitInstruction& wait) const override;

 private:
  bool isAligned(std::uint32_t samples) const;

  const ScriptTraits& traits_;
};

}  // namespace ktwfmscriptcompiler
