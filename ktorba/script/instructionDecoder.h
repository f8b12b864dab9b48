// Reads instruction words back through the table they were written from: for the simulated sequencer, listings and
// tests. Any thread may call.
#pragma once

#include <string>

#include "ktorba/script/instructionFormat.h"

namespace ktorba {

struct DecodedInstruction {
  std::uint8_t opcode = 0;                    // as it stands in the word, 0..15
  const InstructionFormat* format = nullptr;  // name and fields; null for an unknown opcode
  SequenceInstructionWords words;

  bool is(Opcode other) const { return opcode == static_cast<std::uint8_t>(other); }
  // The value of a field of this instruction's own format, as it was before encoding: wordCount from 1, and so on.
  std::uint64_t operator[](const InstructionField& field) const { return readField(words, field); }
};

DecodedInstruction decodeInstruction(const SequenceInstructionWords& words);

// One line without its end: "fetch firstWord=4 wordCount=2 headSkip=3 ..." with every field in the table's order and
// decimal values, or "unknown opcode 9".
std::string describeInstruction(const SequenceInstructionWords& words);

}  // namespace ktorba
