// Compiled scripts as text. Any thread may call.
#pragma once

#include <string>

#include "ktWfmScriptCompiler/CompiledScript.h"
#include "ktWfmScriptCompiler/ScriptTraits.h"

namespace ktwfmscriptcompiler {

// Returns a listing for people: the script on one line, then each block, then each of its fetches, indented.
// Triggers are hardware triggers; clear flags and marker masks are hexadecimal.
std::string printScript(const CompiledScript& script);

// Returns a script text that compiles with `traits` to the same records: one instruction on a line, in lower case.
// `script` must be what the compiler made of some text with these traits: every trigger and marker then has a name.
std::string printAsScript(const CompiledScript& script, const ScriptTraits& traits);

}  // namespace ktwfmscriptcompiler
