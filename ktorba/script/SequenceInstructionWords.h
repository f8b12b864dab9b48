// One 128-bit sequencer instruction. Written to sequence memory in this order, each word little-endian; an
// instruction's index in its program is its address.
#pragma once

#include <array>
#include <cstdint>

namespace nSequenceInstruction {

struct SequenceInstructionWords {
  std::array<std::uint32_t, 4> words{};

  bool operator==(const SequenceInstructionWords&) const = default;
};
static_assert(sizeof(SequenceInstructionWords) == 16);

}  // namespace nSequenceInstruction
