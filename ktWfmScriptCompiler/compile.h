// The compiler in one call: script text in, compiled scripts out. For tools, tests and fuzzers; what compiles many
// texts keeps a Compiler instead.
#pragma once

#include <string>
#include <vector>

#include "ktWfmScriptCompiler/CompiledScript.h"
#include "ktWfmScriptCompiler/ScriptTraits.h"
#include "ktWfmScriptCompiler/SourceMap.h"

namespace ktwfmscriptcompiler {

// Returns one record per script of `text`, in text order, and fills `map` when there is one.
// Raises the first error: of the text's words and grammar, else of its rules. Any thread may call.
std::vector<CompiledScript> compile(const std::string& text, const ScriptTraits& traits, SourceMap* map = nullptr);

}  // namespace ktwfmscriptcompiler
