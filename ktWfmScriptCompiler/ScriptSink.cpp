#include "ktWfmScriptCompiler/ScriptSink.h"

#include <utility>

namespace ktwfmscriptcompiler {

ScriptSink::ScriptSink(Keeps keeps) : keeps_(keeps) {
  if (keeps == Keeps::kScriptsAndMap) map_.emplace();
}

void ScriptSink::startScript(std::string_view name, bool isEndless, SourcePlace place) {
  takeScript(name, isEndless);
  if (map_) map_->push_back({place, {}});
}

SequenceBlock& ScriptSink::appendBlock(SourcePlace place, std::size_t fetchCount) {
  endScript();
  last_.fetches.clear();
  last_ = {.fetches = std::move(last_.fetches)};
  if (keeps_ != Keeps::kNothing) last_.fetches.reserve(fetchCount);
  isOpen_ = true;
  if (map_) map_->back().blocks.push_back({place, {}});
  return last_;
}

void ScriptSink::placeBlock(SourcePlace place) {
  if (map_) map_->back().blocks.back().block = place;
}

void ScriptSink::noteFetch(SourcePlace place) {
  if (keeps_ == Keeps::kNothing) return last_.fetches.clear();
  map_->back().blocks.back().fetches.push_back(place);
}

void ScriptSink::endScript() {
  if (std::exchange(isOpen_, false)) takeBlock(last_);
}

SourceMap ScriptSink::takeMap() { return std::exchange(*map_, {}); }

std::vector<CompiledScript> ScriptCollector::takeScripts() { return std::exchange(scripts_, {}); }

void ScriptCollector::takeScript(std::string_view name, bool isEndless) {
  scripts_.push_back({std::string(name), isEndless, {}});
}

void ScriptCollector::takeBlock(SequenceBlock& block) { scripts_.back().blocks.push_back(std::move(block)); }

}  // namespace ktwfmscriptcompiler
