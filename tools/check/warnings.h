// What compiles and is surely not meant.
#pragma once

#include <vector>

#include "ktWfmScriptCompiler/ScriptTraits.h"
#include "tools/diagnostics/Diagnostic.h"

namespace tools {

// Adds warnings about a text that compiles, at most kMaxWarnings: text behind the last script, instructions behind an
// endless loop, a clear that ends a script, a marker position given twice in one instruction, a trigger that is waited
// for again without having been cleared, a script that another one of its name replaces.
void findWarnings(const ScriptFile& file, const ktwfmscriptcompiler::ScriptTraits& traits,
                  std::vector<Diagnostic>& diagnostics);

}  // namespace tools
