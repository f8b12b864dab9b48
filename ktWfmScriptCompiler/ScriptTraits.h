// What the hardware offers to scripts: the vocabulary of marker and trigger names, and the two numbers that lengths
// are checked against. The compiler holds it by reference and never changes it.
#pragma once

#include <cstdint>
#include <map>
#include <string>

#include "ktcheckname/compareNames.h"

namespace ktwfmscriptcompiler {

using NameMap = std::map<std::string, std::uint32_t, ktcheckname::NameLess>;

struct ScriptTraits {
  std::uint8_t flags[4] = {0, 0, 0, 1};  // carried along; nothing reads them
  NameMap markerNames;                   // name to marker number
  NameMap triggerNames;                  // name to trigger table number, from 0
  std::uint32_t alignmentQuantum = 0;    // samples; 0 asks for no alignment, as 1 does
  std::uint32_t minWaitLength = 0;       // samples
};

// The vocabulary of a session: marker0 to marker7 are 0 to 7, trigger1 to trigger7 are 0 to 6. The two numbers, which
// depend on the hardware, are left at 0.
ScriptTraits standardScriptTraits();

// The hardware trigger 1..8 of a trigger's table number 0..7, of which the last comes first; 0 for any other number.
constexpr std::uint8_t hardwareTriggerOf(std::uint32_t tableNumber) {
  constexpr std::uint32_t kHardwareTriggers = 8;
  return tableNumber < kHardwareTriggers ? static_cast<std::uint8_t>((tableNumber + 1) % kHardwareTriggers + 1) : 0;
}

// The bit of a hardware trigger 1..8 in a clear flag.
constexpr std::uint8_t clearFlagOf(std::uint8_t hardwareTrigger) {
  return static_cast<std::uint8_t>(1u << (hardwareTrigger - 1));
}

// The bit of a marker in a marker mask; 0 for numbers that the mask has no bit for.
constexpr std::uint8_t markerBitOf(std::uint32_t markerNumber) {
  return static_cast<std::uint8_t>(1u << (markerNumber % 32));
}

}  // namespace ktwfmscriptcompiler
