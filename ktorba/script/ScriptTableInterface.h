// The compiled scripts of one session by name, and the name of the active one. Names differing only in letter case
// are one name. An operation that raises changes nothing. One thread at a time.
#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "ktorba/script/CompiledScript.h"
#include "ktorba/script/SequenceInstructionWords.h"

namespace ktorba {

struct ScriptEntry {
  std::uint64_t totalMemoryWords = 0;   // sample-memory words read in one pass, loops counted; saturates
  bool hasUnboundedLoop = false;        // holds a forever or until loop
  bool isEndless = false;               // the whole script is one endless loop
  std::uint32_t finiteMemoryWords = 0;  // totalMemoryWords, at most 0xFFFFFFFF; that value when it does not end
  std::vector<nSequenceInstruction::SequenceInstructionWords> instructionWords;  // instruction 0 first
  CompiledScript script;
  bool isLoaded = false;  // the words are in sequence memory
};

class ScriptTableInterface {
 public:
  virtual ~ScriptTableInterface() = default;

  // Are always false; they keep the interface's slots as they are known.
  virtual bool queryOne() const = 0;
  virtual bool queryTwo() const = 0;

  virtual std::uint64_t getScriptCount() const = 0;

  // Returns the names, as they were first stored, in the order of the name comparison.
  virtual std::vector<std::string> getScriptNames() const = 0;

  // Takes any name, that of no script included; empty: no script is active.
  virtual void setActiveScript(const std::string& name) = 0;

  // Returns the name set last, empty at first; valid until the next change of the table.
  virtual const std::string& getActiveScript() const = 0;

  virtual bool containsScript(const std::string& name) const = 0;

  // Stores `entry`, which must not be null, as not loaded. A script of the same name is replaced; the name keeps the
  // letter case it was first stored with.
  virtual void addScript(const std::string& name, std::shared_ptr<ScriptEntry> entry) = 0;

  // Removes a script, which lives on for those who hold it. When it is the active one, none is active then. Raises
  // ktmxl::kErrorScriptNotInMem.
  virtual void deleteScript(const std::string& name) = 0;

  // Raises ktmxl::kErrorScriptNotInMem.
  virtual std::shared_ptr<ScriptEntry> getScript(const std::string& name) const = 0;

  // Removes all scripts; none is active then.
  virtual void deleteAllScripts() = 0;
};

}  // namespace ktorba
