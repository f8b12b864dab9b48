// The instruction encoder: one resolved instruction in, four words out; see SequenceInstructionsGeneratorInterface.h
// for its operations. Its only state is a copy of the hardware traits, all zero until the first receiveHWTraits(). One
// thread at a time.
#pragma once

#include "ktorba/hwRecords/Interfaces.h"
#include "ktorba/script/SequenceInstructionsGeneratorInterface.h"
#include "ktorba/script/instructionFormat.h"

namespace ktorba {

class SequenceInstructionsGenerator : public HWTraitReceiverInterface, public SequenceInstructionsGeneratorInterface {
 public:
  void receiveHWTraits(const HWTraits& traits) override;

  std::uint32_t encodeScriptStart(SequenceInstructionWords& words) override;
  std::uint32_t encodeScriptEnd(SequenceInstructionWords& words) override;
  std::uint32_t encodeFetch(const FetchDescriptor& fetch, SequenceInstructionWords& words) override;
  std::uint32_t encodeJump(std::uint32_t targetAddress, SequenceInstructionWords& words) override;
  std::uint32_t encodeLoopStart(std::uint32_t bodyAddress, const LoopDescriptor& loop,
                                SequenceInstructionWords& words) override;
  std::uint32_t encodeLoopEnd(std::uint32_t bodyAddress, const LoopDescriptor& loop,
                              SequenceInstructionWords& words) override;
  ExactFetchGeometry measureFetch(const FetchDescriptor& fetch) const override;

 private:
  void checkTraits() const;
  std::uint32_t encodeRead(Opcode opcode, const FetchDescriptor& fetch, SequenceInstructionWords& words) const;

  HWTraits traits_;
};

}  // namespace ktorba
