// Builds the record of one fetch, markers included. Keeps nothing between calls.
#pragma once

#include <string_view>
#include <vector>

#include "ktWfmScriptCompiler/InstructionValidator.h"

namespace ktwfmscriptcompiler {

class FetchInstructionTranslatorInterface {
 public:
  virtual ~FetchInstructionTranslatorInterface() = default;

  // Appends the fetch to `block`. `hardwareTrigger` is 1..8, or 0 for none; `clearFlag` has bit h-1 for hardware
  // trigger h. Raises the errors of the checks on markers, length and offset, in that order.
  virtual void translateFetch(const FetchInstruction& instruction, std::string_view waveformName, bool isWait,
                              std::uint32_t startOffset, std::uint32_t lengthSamples, std::uint8_t hardwareTrigger,
                              std::uint8_t clearFlag, SequenceBlock& block) = 0;

  // Merges the positions of `modifiers` into `markers`: ascending, each position once, with a bit for every marker
  // that fires there. A marker number above 7 leaves a position without a bit.
  virtual void translateMarkers(const NodeList<MarkerModifier>& modifiers, MarkerRecords& markers) = 0;
};

class FetchInstructionTranslator final : public FetchInstructionTranslatorInterface {
 public:
  explicit FetchInstructionTranslator(const InstructionValidatorInterface& validator);
  FetchInstructionTranslator(const FetchInstructionTranslator&) = delete;
  FetchInstructionTranslator& operator=(const FetchInstructionTranslator&) = delete;

  void translateFetch(const FetchInstruction& instruction, std::string_view waveformName, bool isWait,
                      std::uint32_t startOffset, std::uint32_t lengthSamples, std::uint8_t hardwareTrigger,
                      std::uint8_t clearFlag, SequenceBlock& block) override;
  void translateMarkers(const NodeList<MarkerModifier>& modifiers, MarkerRecords& markers) override;

 private:
  const InstructionValidatorInterface& validator_;
};

}  // namespace ktwfmscriptcompiler
