#include "tools/program/warnings.h"

#include <algorithm>
#include <memory>

#include "ktWfmScriptCompiler/ParserImpl.h"
#include "tools/program/faultyScripts.h"

namespace tools {
namespace {

using ktwfmscriptcompiler::downcast;
using ktwfmscriptcompiler::FetchInstruction;
using ktwfmscriptcompiler::GenerateInstruction;
using ktwfmscriptcompiler::Instruction;
using ktwfmscriptcompiler::InstructionContainer;
using ktwfmscriptcompiler::iParseTree;
using ktwfmscriptcompiler::Lexer;
using ktwfmscriptcompiler::LexerInterface;
using ktwfmscriptcompiler::MarkerModifier;
using ktwfmscriptcompiler::NamedProcedure;
using ktwfmscriptcompiler::ParserImpl;
using ktwfmscriptcompiler::ProcedureCollection;
using ktwfmscriptcompiler::RepeatInstruction;
using ktwfmscriptcompiler::RepeatType;
using ktwfmscriptcompiler::ScriptTraits;
using ktwfmscriptcompiler::SourcePosition;
using ktwfmscriptcompiler::Token;
using ktwfmscriptcompiler::TokenType;
using ktwfmscriptcompiler::WaitInstruction;

// A lexer that remembers the token it handed out last.
class RememberingLexer final : public LexerInterface {
 public:
  explicit RememberingLexer(const ScriptTraits& traits) : lexer_(traits) {}

  void setScript(const std::string& text) override { lexer_.setScript(text); }
  Token getNextToken() override { return last_ = lexer_.getNextToken(); }
  const Token& last() const { return last_; }

 private:
  Lexer lexer_;
  Token last_;
};

class WarningFinder {
 public:
  explicit WarningFinder(std::vector<Diagnostic>& diagnostics) : diagnostics_(diagnostics) {}

  void check(const NamedProcedure& script) {
    checkBody(script);
    const Instruction& last = script.instructions.back();
    if (last.type == TokenType::kClear) {
      warn(last.position(), "This clear ends the script: no instruction follows that could clear anything",
           "Move it in front of the wait or the generate that shall clear the trigger.");
    }
  }

  void warn(SourcePosition place, const char* message, const char* help) {
    if (diagnostics_.size() >= kMaxErrors) return;
    diagnostics_.push_back({Diagnostic::Severity::kWarning, toPlace(place), message, help});
  }

 private:
  static bool isEndless(const Instruction& instruction) {
    return instruction.type == TokenType::kRepeat &&
           downcast<RepeatInstruction>(instruction).repeatType == RepeatType::kForever;
  }

  // Loops nest two deep at most in a text that compiles.
  void checkBody(const InstructionContainer& body) {
    for (const Instruction& instruction : body.instructions) {
      if (instruction.type == TokenType::kGenerate) checkMarkers(downcast<GenerateInstruction>(instruction));
      if (instruction.type == TokenType::kWait) checkMarkers(downcast<WaitInstruction>(instruction));
      if (instruction.type == TokenType::kRepeat) checkBody(downcast<RepeatInstruction>(instruction));
      if (isEndless(instruction) && instruction.next != nullptr) {
        warn(instruction.next->position(), "This instruction is never reached: the loop before it has no end",
             "Use repeat with a count or until a trigger, or remove what follows the loop.");
      }
    }
  }

  void checkMarkers(const FetchInstruction& fetch) {
    std::vector<std::pair<std::uint32_t, std::uint32_t>> fired;
    for (const MarkerModifier& marker : fetch.markers) {
      for (const std::uint32_t position : marker.positions) fired.emplace_back(marker.markerNumber, position);
    }
    std::sort(fired.begin(), fired.end());
    const auto twice = std::adjacent_find(fired.begin(), fired.end());
    if (twice == fired.end()) return;
    for (const MarkerModifier& marker : fetch.markers) {
      const bool holdsIt =
          std::find(marker.positions.begin(), marker.positions.end(), twice->second) != marker.positions.end();
      if (marker.markerNumber != twice->first || !holdsIt) continue;
      warn(marker.position(), "A position of this marker is given twice", "A marker fires once at each position.");
      return;
    }
  }

  std::vector<Diagnostic>& diagnostics_;
};

}  // namespace

void findWarnings(const ScriptFile& file, const ScriptTraits& traits, std::vector<Diagnostic>& diagnostics) {
  RememberingLexer lexer(traits);
  ParserImpl parser(traits, &lexer);
  const std::unique_ptr<iParseTree> tree = parser.parse(file.text());
  WarningFinder finder(diagnostics);
  for (const NamedProcedure& script : downcast<ProcedureCollection>(*tree).procedures) finder.check(script);
  if (lexer.last().type == TokenType::kEndOfScript) return;
  finder.warn(lexer.last().position, "The text from here on is never read: it stands behind the last \"end script\"",
              "Begin every script with the keyword script and its name, or put // in front of a remark.");
}

}  // namespace tools
