// The format of sequencer instructions, once: every field of every instruction with its place in the 128 bits. The
// encoder writes through this table, and the decoder, the simulated sequencer and the checks before encoding read it.
// All of it is constant data; any thread may use it.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <span>

#include "ktorba/script/SequenceInstructionWords.h"

namespace ktorba {

using nSequenceInstruction::SequenceInstructionWords;

// A run of bits within one word. The word holds value - bias in its lowest `width` bits.
struct InstructionField {
  const char* name;
  std::uint32_t word;       // 0..3
  std::uint32_t lowestBit;  // 0..31
  std::uint32_t width;      // bits
  std::uint32_t bias = 0;

  constexpr std::uint32_t mask() const { return 0xFFFFFFFFu >> (32 - width); }
  constexpr std::uint64_t min() const { return bias; }
  constexpr std::uint64_t max() const { return std::uint64_t{mask()} + bias; }
};

// Bits 31..28 of word 3; the other values are no instruction.
enum class Opcode : std::uint8_t { kFetch = 1, kLoopStart = 2, kLoopEnd = 3, kJump = 4, kScriptEnd = 5 };
inline constexpr InstructionField kOpcodeField{"opcode", 3, 28, 4};

// Fetch and script end. A fetch reads whole memory words and drops samples at both ends.
namespace fetch_field {
inline constexpr InstructionField kFirstWord{"firstWord", 0, 0, 32};          // memory words from the memory's start
inline constexpr InstructionField kWordCount{"wordCount", 1, 0, 32, 1};       // memory words read, at least 1
inline constexpr InstructionField kHeadSkip{"headSkip", 2, 0, 4};             // samples dropped from the first word
inline constexpr InstructionField kTailSkip{"tailSkip", 2, 4, 4};             // samples dropped from the last word
inline constexpr InstructionField kMarkerMask{"markerMask", 2, 8, 8};         // bit n: marker n fires at markerOffset
inline constexpr InstructionField kClearFlag{"clearFlag", 2, 16, 8};          // bit h-1: clears hardware trigger h
inline constexpr InstructionField kTriggerNumber{"triggerNumber", 2, 24, 4};  // hardware trigger ending a wait; 0 none
inline constexpr InstructionField kIsWait{"isWait", 3, 0, 1};                 // emits no waveform data
inline constexpr InstructionField kIsFinal{"isFinal", 3, 1, 1};               // only in script end
inline constexpr InstructionField kMarkerOffset{"markerOffset", 3, 2, 8};     // samples from the first sample emitted
inline constexpr std::array kAll{kFirstWord, kWordCount,     kHeadSkip, kTailSkip, kMarkerMask,
                                 kClearFlag, kTriggerNumber, kIsWait,   kIsFinal,  kMarkerOffset};
}  // namespace fetch_field

// Loop start and loop end. With isUntil and isCounted both clear the loop runs forever.
namespace loop_field {
inline constexpr InstructionField kIterationCount{"iterationCount", 0, 0, 32};
inline constexpr InstructionField kBodyAddress{"bodyAddress", 1, 0, 32};        // instruction behind the loop start
inline constexpr InstructionField kTriggerNumber{"triggerNumber", 2, 0, 3, 1};  // 1..8, of use with isUntil alone
inline constexpr InstructionField kIsUntil{"isUntil", 2, 4, 1};
inline constexpr InstructionField kIsCounted{"isCounted", 2, 5, 1};
inline constexpr InstructionField kClearFlag{"clearFlag", 2, 6, 8};  // bit h-1: clears hardware trigger h
inline constexpr std::array kAll{kIterationCount, kBodyAddress, kTriggerNumber, kIsUntil, kIsCounted, kClearFlag};
}  // namespace loop_field

namespace jump_field {
inline constexpr InstructionField kTargetAddress{"targetAddress", 0, 0, 32};
inline constexpr std::array kAll{kTargetAddress};
}  // namespace jump_field

struct InstructionFormat {
  Opcode opcode;
  const char* name;
  std::span<const InstructionField> fields;  // the opcode's own field left out
};

inline constexpr std::array kInstructionFormats{
    InstructionFormat{Opcode::kFetch, "fetch", fetch_field::kAll},
    InstructionFormat{Opcode::kLoopStart, "loopStart", loop_field::kAll},
    InstructionFormat{Opcode::kLoopEnd, "loopEnd", loop_field::kAll},
    InstructionFormat{Opcode::kJump, "jump", jump_field::kAll},
    InstructionFormat{Opcode::kScriptEnd, "scriptEnd", fetch_field::kAll},
};

constexpr std::uint64_t readField(const SequenceInstructionWords& instruction, const InstructionField& field) {
  return std::uint64_t{(instruction.words[field.word] >> field.lowestBit) & field.mask()} + field.bias;
}

// Cuts the value to the field's width; the field must still be clear.
constexpr void writeField(SequenceInstructionWords& instruction, const InstructionField& field, std::uint32_t value) {
  instruction.words[field.word] |= ((value - field.bias) & field.mask()) << field.lowestBit;
}

// Whether the fields and the opcode lie within their words and share no bit.
constexpr bool isSound(const InstructionFormat& format) {
  std::array<std::uint32_t, 4> used{};
  used[kOpcodeField.word] = kOpcodeField.mask() << kOpcodeField.lowestBit;
  for (const InstructionField& field : format.fields) {
    if (field.word > 3 || field.width == 0 || field.lowestBit + field.width > 32) return false;
    const std::uint32_t bits = field.mask() << field.lowestBit;
    if ((used[field.word] & bits) != 0) return false;
    used[field.word] |= bits;
  }
  return true;
}

constexpr bool areSound(std::span<const InstructionFormat> formats) {
  for (const InstructionFormat& format : formats) {
    if (!isSound(format)) return false;
  }
  return true;
}
static_assert(areSound(kInstructionFormats), "fields of an instruction overlap or leave its words");

}  // namespace ktorba
