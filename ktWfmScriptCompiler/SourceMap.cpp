#include "ktWfmScriptCompiler/SourceMap.h"

namespace ktwfmscriptcompiler {

namespace {

// Deals the fetch instructions of one procedure, in text order, to the blocks that they were translated into.
class FetchDealer {
 public:
  explicit FetchDealer(std::vector<BlockPositions>& blocks, const CompiledScript& script)
      : blocks_(blocks), script_(script) {}

  void dealBody(const InstructionContainer& body) {
    for (const Instruction& instruction : body.instructions) {
      if (instruction.type == TokenType::kRepeat) {
        dealLoop(downcast<RepeatInstruction>(instruction));
      } else if (instruction.type != TokenType::kClear) {
        dealFetch(instruction.position(), instruction.position());
      }
    }
  }

 private:
  // A loop that has become a block holds no further loop.
  void dealLoop(const RepeatInstruction& loop) {
    for (const Instruction& instruction : loop.instructions) {
      if (instruction.type != TokenType::kClear) dealFetch(instruction.position(), loop.position());
    }
  }

  void dealFetch(SourcePosition fetch, SourcePosition block) {
    if (blocks_.empty() || blocks_.back().fetches.size() == script_.blocks[blocks_.size() - 1].fetches.size()) {
      blocks_.push_back({block, {}});
    }
    blocks_.back().fetches.push_back(fetch);
  }

  std::vector<BlockPositions>& blocks_;
  const CompiledScript& script_;
};

ScriptPositions mapProcedure(const NamedProcedure& procedure, const CompiledScript& script) {
  ScriptPositions positions{procedure.position(), {}};
  FetchDealer dealer(positions.blocks, script);
  if (script.isEndless) {
    dealer.dealBody(downcast<RepeatInstruction>(procedure.instructions.front()));
  } else {
    dealer.dealBody(procedure);
  }
  return positions;
}

}  // namespace

SourceMap mapSource(const ProcedureCollection& tree, const std::vector<CompiledScript>& scripts) {
  SourceMap map;
  map.reserve(scripts.size());
  for (const NamedProcedure& procedure : tree.procedures) map.push_back(mapProcedure(procedure, scripts[map.size()]));
  return map;
}

}  // namespace ktwfmscriptcompiler
