// What instruction words mean, in words, and what they cost and last.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "tools/program/ProgramBuilder.h"

namespace tools {

struct ListedInstruction {
  std::string meaning;            // "play pulse[0, 1000), marker0 at 0"
  std::uint64_t memoryWords = 0;  // read from sample memory in one pass; 0 for loops and jumps
  std::uint64_t samples = 0;      // played in one pass
  bool isWaitForTrigger = false;  // then a pass is repeated until the trigger comes
};

// The instruction at that address.
ListedInstruction listInstruction(const Program& program, std::size_t address, const ProgramBuilder& builder);

// The samples that the program plays from start to end; nothing when it loops or waits without a known end, or when
// the number passes 64 bits. The trigger that starts generation is taken to be there.
std::optional<std::uint64_t> countPlayedSamples(const Program& program, const ProgramBuilder& builder);

// "12.3 ms", "for ever", or "until trigger3" and the like.
std::string describeDuration(const Program& program, const ProgramBuilder& builder, double sampleRateHz);

}  // namespace tools
