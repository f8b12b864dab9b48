// Finds the errors of a text whose compilation failed: the first one of each of its scripts.
#pragma once

#include <vector>

#include "ktWfmScriptCompiler/ScriptTraits.h"
#include "ktWfmScriptCompiler/SourcePosition.h"
#include "tools/diagnostics/Diagnostic.h"

namespace tools {

constexpr Place toPlace(ktwfmscriptcompiler::SourcePosition position) {
  return {position.line, position.positionInLine};
}

// More errors or warnings than these are not worth reading.
inline constexpr std::size_t kMaxErrors = 100;

// Adds at least one diagnostic for a text that does not compile, at most kMaxErrors. Behind an error it goes on at the
// next "script" that begins a script.
void findScriptErrors(const ScriptFile& file, const ktwfmscriptcompiler::ScriptTraits& traits,
                      std::vector<Diagnostic>& diagnostics);

}  // namespace tools
