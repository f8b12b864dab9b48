#include "ktWfmScriptCompiler/SourceMap.h"

namespace ktwfmscriptcompiler {

namespace {

// Deals fetch instructions, in text order, to blocks that are cut as translation cuts them.
class FetchDealer {
 public:
  explicit FetchDealer(std::vector<BlockPositions>& blocks) : blocks_(blocks) {}

  void dealBody(const InstructionContainer& body) {
    for (const Instruction& instruction : body.instructions) {
      if (instruction.type == TokenType::kRepeat) {
        dealLoop(downcast<RepeatInstruction>(instruction));
      } else if (instruction.type != TokenType::kClear) {
        dealFetch(instruction, instruction);
      }
    }
  }

 private:
  // Holds no further loop: that would break a rule.
  void dealLoop(const RepeatInstruction& loop) {
    needsBlock_ = true;
    for (const Instruction& instruction : loop.instructions) {
      if (instruction.type != TokenType::kClear) dealFetch(instruction, loop);
    }
    needsBlock_ = true;
  }

  void dealFetch(const Instruction& fetch, const Instruction& block) {
    if (needsBlock_) blocks_.push_back({block.position(), {}});
    needsBlock_ = false;
    blocks_.back().fetches.push_back(fetch.position());
  }

  std::vector<BlockPositions>& blocks_;
  bool needsBlock_ = true;
};

ScriptPositions mapProcedure(const NamedProcedure& procedure) {
  ScriptPositions positions{procedure.position(), {}};
  const RepeatInstruction* const loop = scriptWideLoop(procedure);
  FetchDealer dealer(positions.blocks);
  dealer.dealBody(loop == nullptr ? static_cast<const InstructionContainer&>(procedure) : *loop);
  return positions;
}

}  // namespace

SourceMap mapSource(const iParseTree& root) {
  SourceMap map;
  for (const NamedProcedure& procedure : downcast<ProcedureCollection>(root).procedures) {
    map.push_back(mapProcedure(procedure));
  }
  return map;
}

}  // namespace ktwfmscriptcompiler
