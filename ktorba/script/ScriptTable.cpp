#include "ktorba/script/ScriptTable.h"

#include "kterr/Failure.h"

namespace ktorba {
namespace {

constexpr char kSource[] = R"(ktorba\script\ScriptTable)";

template <typename Position>
Position found(Position position, Position end, const std::string& name) {
  if (position == end) {
    kterr::Failure(ktmxl::kErrorScriptNotInMem).at(kSource).usage(kterr::kUsageTypeScriptName, name).raise();
  }
  return position;
}

}  // namespace

std::uint64_t ScriptTable::getScriptCount() const { return entries_.size(); }

std::vector<std::string> ScriptTable::getScriptNames() const {
  std::vector<std::string> names;
  names.reserve(entries_.size());
  for (const auto& [name, entry] : entries_) names.push_back(name);
  return names;
}

void ScriptTable::setActiveScript(const std::string& name) { activeScriptName_ = name; }

const std::string& ScriptTable::getActiveScript() const { return activeScriptName_; }

bool ScriptTable::containsScript(const std::string& name) const { return entries_.contains(name); }

void ScriptTable::addScript(const std::string& name, std::shared_ptr<ScriptEntry> entry) {
  entry->isLoaded = false;
  entries_[name] = std::move(entry);
}

void ScriptTable::deleteScript(const std::string& name) {
  const auto position = found(entries_.find(name), entries_.end(), name);
  const bool isActive = ktcheckname::compareNames(name, activeScriptName_) == 0;
  entries_.erase(position);
  if (isActive) activeScriptName_.clear();
}

std::shared_ptr<ScriptEntry> ScriptTable::getScript(const std::string& name) const {
  return found(entries_.find(name), entries_.end(), name)->second;
}

void ScriptTable::deleteAllScripts() {
  entries_.clear();
  activeScriptName_.clear();
}

}  // namespace ktorba
