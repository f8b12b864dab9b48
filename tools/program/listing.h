// What instruction words mean, in words, and what one pass of them costs and lasts.
#pragma once

#include <cstdint>
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

}  // namespace tools
