#include "ktWfmScriptCompiler/ScriptTraits.h"

namespace ktwfmscriptcompiler {

ScriptTraits standardScriptTraits() {
  ScriptTraits traits;
  for (std::uint32_t marker = 0; marker < 8; ++marker) traits.markerNames["marker" + std::to_string(marker)] = marker;
  for (std::uint32_t trigger = 0; trigger < 7; ++trigger) {
    traits.triggerNames["trigger" + std::to_string(trigger + 1)] = trigger;
  }
  return traits;
}

}  // namespace ktwfmscriptcompiler
