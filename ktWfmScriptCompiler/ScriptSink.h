// Where compiled scripts go: block by block, as they are translated, so that whoever turns them into records of its
// own never keeps both. Belongs to the thread that translates.
#pragma once

#include <string_view>
#include <vector>

#include "ktWfmScriptCompiler/CompiledScript.h"

namespace ktwfmscriptcompiler {

// The scripts of one text while it is translated. Scripts come in text order, blocks in play order.
class ScriptSink {
 public:
  virtual ~ScriptSink() = default;

  // Begins the next script; `isEndless` as in CompiledScript.
  virtual void startScript(std::string_view name, bool isEndless) = 0;
  // Begins the next block of that script, which completes the one before.
  SequenceBlock& appendBlock();
  // The block begun last, of which there is one.
  SequenceBlock& lastBlock() { return last_; }
  // Completes the last block, if there is one.
  void endScript();

 private:
  // Gets a complete block of the script begun last and may move from it; what it leaves of the block's memory serves
  // the next one.
  virtual void takeBlock(SequenceBlock& block) = 0;

  SequenceBlock last_;
  bool isOpen_ = false;  // `last_` has been begun and not been completed
};

// Keeps the scripts as they come.
class ScriptCollector final : public ScriptSink {
 public:
  void startScript(std::string_view name, bool isEndless) override;
  std::vector<CompiledScript> takeScripts();  // leaves none

 private:
  void takeBlock(SequenceBlock& block) override;

  std::vector<CompiledScript> scripts_;
};

}  // namespace ktwfmscriptcompiler
