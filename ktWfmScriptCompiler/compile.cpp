#include "ktWfmScriptCompiler/compile.h"

#include "ktWfmScriptCompiler/Compiler.h"

namespace ktwfmscriptcompiler {

std::vector<CompiledScript> compile(const std::string& text, const ScriptTraits& traits, SourceMap* map) {
  using Keeps = ScriptSink::Keeps;
  ScriptCollector scripts(map == nullptr ? Keeps::kScripts : Keeps::kScriptsAndMap);
  Compiler(traits).compile(text, scripts);
  if (map != nullptr) *map = scripts.takeMap();
  return scripts.takeScripts();
}

}  // namespace ktwfmscriptcompiler
