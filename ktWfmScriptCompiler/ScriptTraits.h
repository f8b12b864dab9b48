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
  NameMap triggerNames;                  // name to table number, of which hardwareTriggerOf() makes a trigger
  std::uint32_t alignmentQuantum = 0;    // samples; 0 asks for no alignment, as 1 does
  std::uint32_t minWaitLength = 0;       // samples
};

// The vocabulary of a session: all markers and triggers that scripts may name, under the names that
// conventions/conventions.h gives them. The two numbers, which depend on the hardware, are left at 0.
ScriptTraits standardScriptTraits();

}  // namespace ktwfmscriptcompiler
