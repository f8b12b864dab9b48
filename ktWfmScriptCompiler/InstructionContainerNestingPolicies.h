// Keeps which procedure and which loops are being translated, and refuses a repeat loop inside a repeat loop.
// Belongs to the thread that translates.
#pragma once

#include <optional>

#include "ktWfmScriptCompiler/ParseTree.h"

namespace ktwfmscriptcompiler {

class NestingPoliciesInterface {
 public:
  virtual ~NestingPoliciesInterface() = default;

  virtual void reset() = 0;
  virtual void enterProcedure(const iParseTree& procedure) = 0;
  virtual void leaveProcedure() = 0;

  // A repeat forever that is the whole body of its procedure: does not count as a repeat loop.
  virtual void enterScriptLoop(const iParseTree& loop) = 0;
  virtual void leaveScriptLoop() = 0;

  // Raises kErrorRepeatLoopNestingTooDeepInScript while another repeat loop is open.
  virtual void enterRepeatLoop(const iParseTree& loop) = 0;
  virtual void leaveRepeatLoop() = 0;

  // Where the innermost open construct stands: the repeat loop, else the script-wide loop, else the procedure.
  // 0 after reset.
  virtual std::uint32_t getLineNumber() const = 0;
  virtual std::uint32_t getPositionInLine() const = 0;
};

class InstructionContainerNestingPolicies final : public NestingPoliciesInterface {
 public:
  void reset() override;
  void enterProcedure(const iParseTree& procedure) override;
  void leaveProcedure() override;
  void enterScriptLoop(const iParseTree& loop) override;
  void leaveScriptLoop() override;
  void enterRepeatLoop(const iParseTree& loop) override;
  void leaveRepeatLoop() override;
  std::uint32_t getLineNumber() const override;
  std::uint32_t getPositionInLine() const override;

 private:
  SourcePosition innermost() const;

  SourcePosition procedure_;
  std::optional<SourcePosition> scriptLoop_;
  std::optional<SourcePosition> repeatLoop_;
};

}  // namespace ktwfmscriptcompiler
