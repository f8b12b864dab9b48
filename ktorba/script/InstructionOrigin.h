// Which part of a compiled script an instruction word comes from: what a listing needs to set words beside the script.
#pragma once

#include <cstdint>

namespace ktorba {

struct InstructionOrigin {
  enum class Part : std::uint8_t { kScriptStart, kLoopStart, kFetch, kLoopEnd, kJump, kScriptEnd };

  Part part = Part::kScriptStart;
  std::uint32_t block = 0;  // index into CompiledScript::blocks; 0 for start, jump and end of the script
  std::uint32_t fetch = 0;  // index into SequenceBlock::fetches; 0 for all but fetches

  bool operator==(const InstructionOrigin&) const = default;
};

}  // namespace ktorba
