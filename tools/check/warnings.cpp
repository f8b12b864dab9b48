#include "tools/check/warnings.h"

#include <algorithm>
#include <bitset>
#include <map>
#include <optional>

#include "conventions/conventions.h"
#include "ktcheckname/compareNames.h"
#include "tools/check/checkText.h"

namespace tools {
namespace {

using ktwfmscriptcompiler::ClearInstruction;
using ktwfmscriptcompiler::downcast;
using ktwfmscriptcompiler::FetchInstruction;
using ktwfmscriptcompiler::GenerateInstruction;
using ktwfmscriptcompiler::Instruction;
using ktwfmscriptcompiler::InstructionContainer;
using ktwfmscriptcompiler::MarkerModifier;
using ktwfmscriptcompiler::NamedProcedure;
using ktwfmscriptcompiler::ProcedureCollection;
using ktwfmscriptcompiler::RepeatInstruction;
using ktwfmscriptcompiler::RepeatType;
using ktwfmscriptcompiler::SourcePosition;
using ktwfmscriptcompiler::Token;
using ktwfmscriptcompiler::TokenType;
using ktwfmscriptcompiler::WaitInstruction;
using ktwfmscriptcompiler::WaitType;

using TriggerSet = std::bitset<ktorba::kTriggerCount>;  // by table number

// The triggers that a body clears anywhere. Loops nest two deep at most in a text that compiles, so the functions here
// may call themselves for the body of a loop.
TriggerSet clearedIn(const InstructionContainer& body) {
  TriggerSet cleared;
  for (const Instruction& instruction : body.instructions) {
    if (instruction.type == TokenType::kRepeat) cleared |= clearedIn(downcast<RepeatInstruction>(instruction));
    if (instruction.type != TokenType::kClear) continue;
    for (const std::uint32_t trigger : downcast<ClearInstruction>(instruction).triggers) cleared.set(trigger);
  }
  return cleared;
}

bool isEndless(const RepeatInstruction& loop) { return loop.repeatType == RepeatType::kForever; }

bool runsMoreThanOnce(const RepeatInstruction& loop) {
  return loop.repeatType != RepeatType::kCounted || loop.iterationCount > 1;
}

// The trigger that an instruction waits for, or nothing.
std::optional<std::uint32_t> awaitedTrigger(const Instruction& instruction) {
  if (instruction.type == TokenType::kWait) {
    const auto& wait = downcast<WaitInstruction>(instruction);
    if (wait.waitType == WaitType::kUntilTrigger) return wait.trigger;
  }
  if (instruction.type == TokenType::kRepeat) {
    const auto& loop = downcast<RepeatInstruction>(instruction);
    if (loop.repeatType == RepeatType::kUntilTrigger) return loop.trigger;
  }
  return std::nullopt;
}

std::string nameOfTrigger(std::uint32_t tableNumber) {
  return ktorba::triggerName(ktorba::hardwareTriggerOf(tableNumber));
}

class WarningFinder {
 public:
  explicit WarningFinder(std::vector<Diagnostic>& diagnostics) : diagnostics_(diagnostics) {}

  void check(const NamedProcedure& script) {
    checkName(script);
    arrived_.reset();
    checkBody(script);
    const Instruction& last = script.instructions.back();
    if (last.type == TokenType::kClear) {
      warn(last.position(), MessageKind::kClearEndsScript);
    }
  }

  void warn(SourcePosition place, MessageKind kind, const std::string& value = {},
            std::vector<Diagnostic::Related> related = {}) {
    if (diagnostics_.size() >= kMaxWarnings) return;
    Diagnostic& diagnostic = diagnostics_.emplace_back();
    diagnostic.severity = Diagnostic::Severity::kWarning;
    diagnostic.place = toPlace(place);
    diagnostic.related = std::move(related);
    say(diagnostic, kind, {value});
  }

 private:
  struct OpenLoop {
    SourcePosition position;
    TriggerSet cleared;
  };

  // The last script of a name is the one that is kept.
  void checkName(const NamedProcedure& script) {
    const auto [first, isNew] = scripts_.emplace(script.name, script.position());
    if (isNew) return;
    warn(first->second, MessageKind::kReplacedScript, first->first,
         {{toPlace(script.position()), "This is the one that plays"}});
    first->second = script.position();
  }

  void checkBody(const InstructionContainer& body) {
    for (const Instruction& instruction : body.instructions) {
      if (const auto trigger = awaitedTrigger(instruction)) checkAwaited(instruction, *trigger);
      switch (instruction.type) {
        case TokenType::kGenerate:
          checkMarkers(downcast<GenerateInstruction>(instruction));
          break;
        case TokenType::kWait:
          checkMarkers(downcast<WaitInstruction>(instruction));
          break;
        case TokenType::kClear:
          for (const std::uint32_t trigger : downcast<ClearInstruction>(instruction).triggers) arrived_.reset(trigger);
          break;
        default:
          checkLoop(downcast<RepeatInstruction>(instruction));
          break;
      }
    }
  }

  void checkLoop(const RepeatInstruction& loop) {
    const TriggerSet cleared = clearedIn(loop);
    arrived_ &= ~cleared;
    if (runsMoreThanOnce(loop)) openLoops_.push_back({loop.position(), cleared});
    checkBody(loop);
    if (runsMoreThanOnce(loop)) openLoops_.pop_back();
    if (!isEndless(loop) || loop.next == nullptr) return;
    warn(loop.next->position(), MessageKind::kNeverReached);
  }

  // A trigger that has arrived stays set until it is cleared, so that the next wait for it ends at once.
  void checkAwaited(const Instruction& instruction, std::uint32_t trigger) {
    const std::string name = nameOfTrigger(trigger);
    const auto loop = std::ranges::find_if(openLoops_.rbegin(), openLoops_.rend(),
                                           [trigger](const OpenLoop& open) { return !open.cleared.test(trigger); });
    if (loop != openLoops_.rend()) {
      warn(instruction.position(), MessageKind::kWaitsOnce, name, {{toPlace(loop->position), "The loop is this one"}});
    } else if (arrived_.test(trigger)) {
      warn(instruction.position(), MessageKind::kWaitsNoMore, name);
    }
    arrived_.set(trigger);
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
      warn(marker.position(), MessageKind::kMarkerTwice);
      return;
    }
  }

  std::vector<Diagnostic>& diagnostics_;
  std::map<std::string, SourcePosition, ktcheckname::NameLess> scripts_;  // the last of each name so far
  std::vector<OpenLoop> openLoops_;                                       // that run more than once
  TriggerSet arrived_;                                                    // and not cleared since
};

}  // namespace

std::vector<Diagnostic> findWarnings(const ProcedureCollection& tree, const Token& next) {
  std::vector<Diagnostic> diagnostics;
  WarningFinder finder(diagnostics);
  for (const NamedProcedure& script : tree.procedures) finder.check(script);
  std::ranges::stable_sort(diagnostics, {}, &Diagnostic::place);
  if (next.type == TokenType::kEndOfScript) return diagnostics;
  finder.warn(next.position, MessageKind::kNeverRead);
  return diagnostics;
}

}  // namespace tools
