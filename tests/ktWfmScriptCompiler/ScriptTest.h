// What the tests of the script compiler share.
#pragma once

#include "ktWfmScriptCompiler/compile.h"
#include "testing/caught.h"

namespace ktwfmscriptcompiler {

// A session's vocabulary; lengths are multiples of 8 and waits at least 64 samples.
inline ScriptTraits testTraits() {
  ScriptTraits traits = standardScriptTraits();
  traits.alignmentQuantum = 8;
  traits.minWaitLength = 64;
  return traits;
}

}  // namespace ktwfmscriptcompiler
