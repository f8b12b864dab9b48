// The compiled scripts of one session in host memory, and the name of the active one: see ScriptTableInterface.h for
// its operations. One thread at a time.
#pragma once

#include <map>

#include "ktcheckname/compareNames.h"
#include "ktorba/script/ScriptTableInterface.h"

namespace ktorba {

class ScriptTable : public ScriptTableInterface {
 public:
  bool queryOne() const override { return false; }
  bool queryTwo() const override { return false; }
  std::uint64_t getScriptCount() const override;
  std::vector<std::string> getScriptNames() const override;
  void setActiveScript(const std::string& name) override;
  const std::string& getActiveScript() const override;
  bool containsScript(const std::string& name) const override;
  void addScript(const std::string& name, std::shared_ptr<ScriptEntry> entry) override;
  void deleteScript(const std::string& name) override;
  std::shared_ptr<ScriptEntry> getScript(const std::string& name) const override;
  void deleteAllScripts() override;

 private:
  std::map<std::string, std::shared_ptr<ScriptEntry>, ktcheckname::NameLess> entries_;
  std::string activeScriptName_;
};

}  // namespace ktorba
