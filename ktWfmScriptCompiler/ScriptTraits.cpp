#include "ktWfmScriptCompiler/ScriptTraits.h"

#include "conventions/conventions.h"

namespace ktwfmscriptcompiler {

ScriptTraits standardScriptTraits() {
  ScriptTraits traits;
  for (std::uint32_t marker = 0; marker < ktorba::kMarkerCount; ++marker) {
    traits.markerNames[ktorba::markerName(marker)] = marker;
  }
  for (std::uint32_t number = 0; number < ktorba::kTriggerCount; ++number) {
    traits.triggerNames[ktorba::triggerName(ktorba::hardwareTriggerOf(number))] = number;
  }
  return traits;
}

}  // namespace ktwfmscriptcompiler
