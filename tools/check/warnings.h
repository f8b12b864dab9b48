// What compiles and is surely not meant.
#pragma once

#include <vector>

#include "ktWfmScriptCompiler/ParseTree.h"
#include "tools/diagnostics/Diagnostic.h"

namespace tools {

// The warnings about a text that compiles, in its order, at most kMaxWarnings: text behind the last script,
// instructions behind an endless loop, a clear that ends a script, a marker position given twice in one instruction, a
// trigger that is waited for again without having been cleared, a script that another one of its name replaces. `next`
// is the token behind the last script.
std::vector<Diagnostic> findWarnings(const ktwfmscriptcompiler::ProcedureCollection& tree,
                                     const ktwfmscriptcompiler::Token& next);

}  // namespace tools
