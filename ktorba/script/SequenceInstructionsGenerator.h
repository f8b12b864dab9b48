// The instruction encoder: one resolved instruction in, four words out. Its only state is a copy of the hardware
// traits, all zero until the first receiveHWTraits(). One thread at a time.
//
// While a sample has fewer than 8 bits or a memory word holds no sample, encoding anything that reads memory raises
// ktorba_errors::kErrorInternalSWError with a message that names the trait.
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
