// Where compiled scripts go: block by block, as they are translated, so that whoever turns them into records of its
// own never keeps both. Belongs to the thread that translates.
#pragma once

#include <optional>
#include <string_view>
#include <vector>

#include "ktWfmScriptCompiler/CompiledScript.h"
#include "ktWfmScriptCompiler/SourceMap.h"

namespace ktwfmscriptcompiler {

// The scripts of one text while it is translated: scripts in text order, blocks in play order. With everything comes
// the place where it stands in the text; a sink that keeps a map notes it, any other one forgets it at once.
class ScriptSink {
 public:
  enum class Keeps { kScripts, kScriptsAndMap, kNothing };

  // Keeping nothing serves those who only ask whether scripts compile: a block has its last fetch alone then.
  explicit ScriptSink(Keeps keeps = Keeps::kScripts);
  virtual ~ScriptSink() = default;

  // Begins the next script; `isEndless` as in CompiledScript.
  void startScript(std::string_view name, bool isEndless, SourcePlace place);
  // Begins the next block of that script, for `fetchCount` fetches, which completes the one before. `place` is that of
  // its first fetch.
  SequenceBlock& appendBlock(SourcePlace place, std::size_t fetchCount);
  // The block begun last, of which there is one.
  SequenceBlock& lastBlock() { return last_; }
  // Gives this block another place: that of its repeat, once its body has shown that it is a loop's.
  void placeBlock(SourcePlace place);
  // Gives this block's next fetch its place.
  void placeFetch(SourcePlace place) {
    if (keeps_ != Keeps::kScripts) noteFetch(place);
  }
  // Completes the last block, if there is one.
  void endScript();

  SourceMap takeMap();  // of a sink that keeps one; leaves it empty

 private:
  virtual void takeScript(std::string_view name, bool isEndless) = 0;
  // Gets a complete block of the script taken last and may move from it; what it leaves of the block's memory serves
  // the next one.
  virtual void takeBlock(SequenceBlock& block) = 0;

  void noteFetch(SourcePlace place);

  Keeps keeps_;
  SequenceBlock last_;
  bool isOpen_ = false;  // `last_` has been begun and not been completed
  std::optional<SourceMap> map_;
};

// Keeps the scripts as they come.
class ScriptCollector final : public ScriptSink {
 public:
  using ScriptSink::ScriptSink;
  std::vector<CompiledScript> takeScripts();  // leaves none

 private:
  void takeScript(std::string_view name, bool isEndless) override;
  void takeBlock(SequenceBlock& block) override;

  std::vector<CompiledScript> scripts_;
};

}  // namespace ktwfmscriptcompiler
