#include "ktWfmScriptCompiler/ScriptSink.h"

#include <utility>

namespace ktwfmscriptcompiler {

SequenceBlock& ScriptSink::appendBlock() {
  endScript();
  last_.fetches.clear();
  last_ = {.fetches = std::move(last_.fetches)};
  isOpen_ = true;
  return last_;
}

void ScriptSink::endScript() {
  if (std::exchange(isOpen_, false)) takeBlock(last_);
}

void ScriptCollector::startScript(std::string_view name, bool isEndless) {
  scripts_.push_back({std::string(name), isEndless, {}});
}

std::vector<CompiledScript> ScriptCollector::takeScripts() { return std::exchange(scripts_, {}); }

void ScriptCollector::takeBlock(SequenceBlock& block) { scripts_.back().blocks.push_back(std::move(block)); }

}  // namespace ktwfmscriptcompiler
