// The border between the compiler's records and the engine's: types of the same shape, so that neither side's
// records change with the other's.
#pragma once

#include <vector>

#include "ktWfmScriptCompiler/ScriptSink.h"
#include "ktorba/script/CompiledScript.h"

namespace ktorba {

// Copies what the compiler translates into records of the engine, field by field.
class EngineRecords final : public ktwfmscriptcompiler::ScriptSink {
 public:
  using ScriptSink::ScriptSink;
  std::vector<CompiledScript> takeScripts();  // leaves none

 private:
  void takeScript(std::string_view name, bool isEndless) override;
  void takeBlock(ktwfmscriptcompiler::SequenceBlock& block) override;

  std::vector<CompiledScript> scripts_;
};

}  // namespace ktorba
