// Where in the text the parts of compiled scripts stand: for tools that explain a compiled script. It has one entry
// per compiled script, block and fetch, in the same order. A ScriptSink keeps one on demand.
#pragma once

#include <vector>

#include "ktWfmScriptCompiler/SourcePosition.h"

namespace ktwfmscriptcompiler {

struct BlockPlaces {
  SourcePlace block;                 // its repeat, or the first fetch of a plain block
  std::vector<SourcePlace> fetches;  // the instruction of each fetch

  bool operator==(const BlockPlaces&) const = default;
};

struct ScriptPlaces {
  SourcePlace script;
  std::vector<BlockPlaces> blocks;

  bool operator==(const ScriptPlaces&) const = default;
};

using SourceMap = std::vector<ScriptPlaces>;

}  // namespace ktwfmscriptcompiler
