// Where in the text the parts of compiled scripts stand: for tools that explain a compiled script. It has one entry
// per compiled script, block and fetch, in the same order.
#pragma once

#include <vector>

#include "ktWfmScriptCompiler/ParseTree.h"

namespace ktwfmscriptcompiler {

struct BlockPositions {
  SourcePosition block;                 // its repeat, or the first fetch of a plain block
  std::vector<SourcePosition> fetches;  // the instruction of each fetch

  bool operator==(const BlockPositions&) const = default;
};

struct ScriptPositions {
  SourcePosition script;  // its keyword
  std::vector<BlockPositions> blocks;

  bool operator==(const ScriptPositions&) const = default;
};

using SourceMap = std::vector<ScriptPositions>;

// Returns the map of the scripts that `root`, a ProcedureCollection that breaks no rule, is translated to.
SourceMap mapSource(const iParseTree& root);

}  // namespace ktwfmscriptcompiler
