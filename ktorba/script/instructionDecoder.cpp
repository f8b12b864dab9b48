#include "ktorba/script/instructionDecoder.h"

#include <algorithm>

namespace ktorba {

DecodedInstruction decodeInstruction(const SequenceInstructionWords& words) {
  DecodedInstruction decoded;
  decoded.opcode = static_cast<std::uint8_t>(readField(words, kOpcodeField));
  decoded.words = words;
  const auto format = std::ranges::find_if(
      kInstructionFormats, [&decoded](const InstructionFormat& known) { return decoded.is(known.opcode); });
  if (format != kInstructionFormats.end()) decoded.format = &*format;
  return decoded;
}

std::string describeInstruction(const SequenceInstructionWords& words) {
  const DecodedInstruction decoded = decodeInstruction(words);
  if (decoded.format == nullptr) return "unknown opcode " + std::to_string(decoded.opcode);
  std::string text = decoded.format->name;
  for (const InstructionField& field : decoded.format->fields) {
    text.append(" ").append(field.name).append("=").append(std::to_string(decoded[field]));
  }
  return text;
}

}  // namespace ktorba
