#include "tools/check/describeFault.h"

#include <algorithm>
#include <tuple>

#include "ktWfmScriptCompiler/ByteClass.h"
#include "ktWfmScriptCompiler/Keywords.h"
#include "kterr/hexText.h"
#include "kterr/usageTags.h"
#include "tools/check/describeNumber.h"
#include "tools/check/foreignWords.h"
#include "tools/check/lookalikes.h"
#include "tools/diagnostics/elaboration.h"
#include "tools/text/characters.h"
#include "tools/text/nearMiss.h"
#include "tools/text/words.h"

namespace tools {
namespace {

using ktwfmscriptcompiler::keywordText;
using Kind = MessageKind;

constexpr TokenType kInstructions[] = {TokenType::kGenerate, TokenType::kWait, TokenType::kRepeat, TokenType::kClear};
constexpr std::size_t kLeastCertain = 4;  // letters of a word that one mistake leaves no doubt about

struct CharacterKind {
  char character;
  MessageKind kind;
};
constexpr CharacterKind kCharacters[] = {
    {'#', Kind::kHash},          {';', Kind::kSemicolon},     {'"', Kind::kQuote},         {'\'', Kind::kQuote},
    {'{', Kind::kBrace},         {'}', Kind::kBrace},         {'[', Kind::kBracket},       {']', Kind::kBracket},
    {'_', Kind::kNameCharacter}, {'-', Kind::kNameCharacter}, {'.', Kind::kNameCharacter}, {'=', Kind::kAssignment},
};

std::string nameOfByte(char byte) {
  const auto value = static_cast<unsigned char>(byte);
  if (value >= 0x21 && value < 0x7F) return std::string("`") + byte + "`";
  return "the byte " + kterr::hexText(value, 2);
}

struct RuleKind {
  std::int32_t code;
  MessageKind kind;
};
namespace errors = ktwfmscriptcompiler_errors;
constexpr RuleKind kRules[] = {
    {errors::kErrorLoopOrProcedureWithNoSamplesGenerated.code, Kind::kNothingPlayed},
    {errors::kErrorInvalidSubsetLengthInScript.code, Kind::kEmptySubset},
    {errors::kErrorMarkerNotSupportedInWait.code, Kind::kMarkerOnTrigger},
    {errors::kErrorClearIsLastInstructionOfLoopInScript.code, Kind::kClearEndsLoop},
    {errors::kErrorInvalidLoopIterationsInScript.code, Kind::kNoPass},
    {errors::kErrorNumSampsToWaitNotGreaterThanMinWaitLengthInScript.code, Kind::kShortWait},
    {errors::kErrorMarkerPositionOutsideSubsetInScript.code, Kind::kMarkerBehindPart},
    {errors::kErrorRepeatLoopNestingTooDeepInScript.code, Kind::kNestedLoop},
    {errors::kErrorMarkerPositionNotMultipleOfQuantum.code, Kind::kUnalignedMarker},
    {errors::kErrorSubsetLengthNotMultipleOfQuantum.code, Kind::kUnalignedSubsetLength},
    {errors::kErrorStartOffsetNotMultipleOfQuantum.code, Kind::kUnalignedSubsetStart},
    {errors::kErrorNumSamplesToWaitNotMultipleOfQuantum.code, Kind::kUnalignedWait},
};

// "96 or 104": the multiples next to a value.
std::string neighboursOf(std::int64_t value, std::int64_t quantum) {
  const std::int64_t below = value / std::max<std::int64_t>(1, quantum) * quantum;
  return (below > 0 ? std::to_string(below) + " or " : "") + std::to_string(below + quantum);
}

void sayRule(Diagnostic& diagnostic, MessageKind kind, const ElaborationRecord& record) {
  constexpr std::size_t kFirst = 2;  // behind line and position
  if (record.values.size() < kFirst + 2) return say(diagnostic, kind);
  const auto& [first, second] = std::tie(record.values[kFirst], record.values[kFirst + 1]);
  say(diagnostic, kind, {first.text, second.text, neighboursOf(first.number.value_or(0), second.number.value_or(1))});
}

std::string withArticle(std::string_view name) {
  const bool isVowel = std::string_view("aeiou").find(name.front()) != std::string_view::npos;
  return (isVowel ? "an " : "a ") + std::string(name);
}

void setConstant(const kterr::ErrorConstant& constant, Diagnostic& diagnostic) {
  diagnostic.constant = constant.text;
  diagnostic.code = constant.code;
}

}  // namespace

Diagnostic FaultDescriber::describe(const SyntaxFault& fault) const {
  Diagnostic diagnostic;
  diagnostic.place = file_.placeOf(tree_.offsetOf(fault));
  if (fault.kind == FaultKind::kEmptyText) diagnostic.place = {};
  diagnostic.length = static_cast<std::uint32_t>(tree_.textOf(fault.token).size());
  setConstant(tree_.constantOf(fault), diagnostic);
  if (describeLookalike(fault, diagnostic)) return diagnostic;
  fault.kind == FaultKind::kToken ? describeToken(fault, diagnostic) : describeGrammar(fault, diagnostic);
  return diagnostic;
}

Diagnostic FaultDescriber::describe(const RuleFault& fault) const {
  Diagnostic diagnostic;
  diagnostic.place = file_.placeOf(tree_.tokens()[fault.token].offset());
  diagnostic.length = static_cast<std::uint32_t>(tree_.textOf(fault.token).size());
  setConstant(*findErrorConstant(fault.code), diagnostic);
  const auto rule = std::ranges::find(kRules, fault.code, &RuleKind::code);
  if (rule == std::end(kRules)) {
    diagnostic.message = findErrorConstant(fault.code)->meaning;
  } else {
    sayRule(diagnostic, rule->kind, fault.record);
  }
  if (fault.opener != kNoIndex) relateOpener(fault.opener, diagnostic);
  return diagnostic;
}

void FaultDescriber::describeToken(const SyntaxFault& fault, Diagnostic& diagnostic) const {
  const std::string_view text = tree_.textOf(fault.token);
  if (tree_.tokens()[fault.token].fault() == TokenFault::kLoneSlash) {
    diagnostic.length = 1;
    say(diagnostic, text.starts_with("/*") ? Kind::kBlockComment : Kind::kLoneSlash);
    return;
  }
  const bool isName = fault.wanted == FaultKind::kNameExpected;
  if (!isName && typeOf(fault.token) == TokenType::kInteger && adviseOnNumber(fault.token, diagnostic)) return;
  if (tree_.tokens()[fault.token].fault() == TokenFault::kBadCharacter) return describeCharacter(fault, diagnostic);
  say(diagnostic, isName ? Kind::kNoName : Kind::kNoNameNorNumber, {quoteWord(text)});
}

void FaultDescriber::describeCharacter(const SyntaxFault& fault, Diagnostic& diagnostic) const {
  const std::string_view text = tree_.textOf(fault.token);
  const auto bad = std::ranges::find(text, ktwfmscriptcompiler::ByteClass::kInvalid, ktwfmscriptcompiler::classOf);
  const auto advice = std::ranges::find(kCharacters, *bad, &CharacterKind::character);
  say(diagnostic, advice == std::end(kCharacters) ? Kind::kStrangeByte : advice->kind, {nameOfByte(*bad)});
  if (*bad != '#') suggest(fault, diagnostic);
}

void FaultDescriber::describeGrammar(const SyntaxFault& fault, Diagnostic& diagnostic) const {
  const std::string word = quoted(fault.token);
  const std::string owner = fault.expected == TokenType::kScript ? "script" : "waveform";
  const bool isWord = typeOf(fault.token) == TokenType::kIdentifier;
  switch (fault.kind) {
    case FaultKind::kEmptyText:
      return say(diagnostic, Kind::kEmptyText);
    case FaultKind::kScriptExpected:
      say(diagnostic, isAtEnd(fault) ? Kind::kNoScript : Kind::kOutsideScript, {word});
      return suggest(fault, diagnostic);
    case FaultKind::kNameExpected:
      return say(diagnostic, Kind::kNameMissing, {owner});
    case FaultKind::kNameMisread:
      say(diagnostic, Kind::kNameMisread, {owner});
      return relateOpener(fault.opener, diagnostic);
    case FaultKind::kEndMisread:
      say(diagnostic, Kind::kEndMisread);
      return relateOpener(fault.opener, diagnostic);
    case FaultKind::kInstructionExpected:
    case FaultKind::kEndExpected:
      return describeStranger(fault, diagnostic);
    case FaultKind::kEndOfWhat:
      return describeEnd(fault, diagnostic);
    case FaultKind::kMarkExpected:
      return describeMark(fault, diagnostic);
    case FaultKind::kNumberExpected:
      say(diagnostic, isWord ? Kind::kNoNumber : Kind::kNumberMissing, {word});
      return relateOpener(fault.opener, diagnostic);
    case FaultKind::kTriggerExpected:
      say(diagnostic, isWord ? Kind::kNoTrigger : Kind::kTriggerMissing, {word, join(candidatesAt(fault, traits_))});
      return suggest(fault, diagnostic);
    case FaultKind::kWaitArgument:
      say(diagnostic, Kind::kWaitArgument);
      return suggest(fault, diagnostic);
    default:
      say(diagnostic, Kind::kRepeatArgument);
      return suggest(fault, diagnostic);
  }
}

// What begins no instruction where one could stand.
void FaultDescriber::describeStranger(const SyntaxFault& fault, Diagnostic& diagnostic) const {
  const TokenType type = typeOf(fault.token);
  const std::string word = quoted(fault.token);
  if (isAtEnd(fault) || type == TokenType::kScript) return describeMissingEnd(fault, diagnostic);
  const std::string advice(explainForeignWord(tree_.textOf(fault.token)));
  switch (type) {
    case TokenType::kEnd:
      say(diagnostic, Kind::kEmptyBody, {nameOfBody(fault.opener)});
      return relateOpener(fault.opener, diagnostic);
    case TokenType::kSubset:
      return say(diagnostic, Kind::kSubsetMisplaced);
    case TokenType::kMarkerName:
      return say(diagnostic, Kind::kMarkerMisplaced);
    case TokenType::kTriggerName:
      return say(diagnostic, Kind::kTriggerMisplaced);
    case TokenType::kIdentifier:
      say(diagnostic, advice.empty() ? Kind::kUnknownInstruction : Kind::kForeignWord, {word, advice});
      break;
    case TokenType::kIf:
    case TokenType::kElse:
    case TokenType::kBreak:
    case TokenType::kOn:
    case TokenType::kStream:
      say(diagnostic, Kind::kReservedWord, {word, advice});
      break;
    default:
      say(diagnostic, Kind::kMisplaced, {word});
      break;
  }
  suggest(fault, diagnostic);
}

void FaultDescriber::describeMissingEnd(const SyntaxFault& fault, Diagnostic& diagnostic) const {
  const bool isEmpty = fault.kind == FaultKind::kInstructionExpected;
  say(diagnostic, isEmpty ? Kind::kEmptyNeverEnded : Kind::kNeverEnded,
      {nameOfBody(fault.opener), typeOf(fault.opener) == TokenType::kRepeat ? "repeat" : "script"});
  relateOpener(fault.opener, diagnostic);
}

void FaultDescriber::describeEnd(const SyntaxFault& fault, Diagnostic& diagnostic) const {
  const TokenType type = typeOf(fault.token);
  const bool isLoop = fault.expected == TokenType::kRepeat;
  const std::string help =
      isLoop ? "Write end repeat: the innermost that is open is a loop." : "Write end script: no loop is open here.";
  if (type == TokenType::kScript && isLoop) {
    say(diagnostic, Kind::kScriptBeforeLoop);
  } else if (type == TokenType::kRepeat && !isLoop) {
    say(diagnostic, Kind::kNoLoopToEnd);
  } else if (type == TokenType::kIdentifier) {
    say(diagnostic, Kind::kEndOfUnknown, {quoted(fault.token), help});
  } else {
    say(diagnostic, Kind::kEndOfNothing, {help});
  }
  suggest(fault, diagnostic);
  relateOpener(fault.opener, diagnostic);
}

void FaultDescriber::describeMark(const SyntaxFault& fault, Diagnostic& diagnostic) const {
  const bool isSubset = fault.opener != kNoIndex && typeOf(fault.opener) == TokenType::kSubset;
  const std::string help =
      isSubset ? "Write subset(OFFSET, LENGTH), in samples." : "Write marker0(POSITION, POSITION).";
  if (fault.expected == TokenType::kCloseParenthesis && typeOf(fault.token) == TokenType::kInteger) {
    say(diagnostic, isSubset ? Kind::kThirdNumber : Kind::kNumbersUnparted, {help});
  } else if (fault.expected == TokenType::kCloseParenthesis && typeOf(fault.token) == TokenType::kComma) {
    say(diagnostic, Kind::kThirdNumber, {help});
  } else if (fault.expected == TokenType::kComma) {
    say(diagnostic, Kind::kSecondNumberMissing, {help});
  } else {
    say(diagnostic, Kind::kMarkMissing, {quoteWord(keywordText(fault.expected)), help});
  }
  relateOpener(fault.opener, diagnostic);
}

bool FaultDescriber::describeLookalike(const SyntaxFault& fault, Diagnostic& diagnostic) const {
  const std::string_view text = tree_.textOf(fault.token);
  const std::size_t offset = tree_.tokens()[fault.token].offset();
  const auto first = findLookalike(text);
  if (!first) return false;
  diagnostic.place = file_.placeOf(offset + first->offset);
  diagnostic.length = static_cast<std::uint32_t>(first->length);
  say(diagnostic, Kind::kLookalike,
      {withArticle(first->lookalike->name), kterr::hexText(first->lookalike->codePoint, 4).substr(2),
       adviceOn(*first->lookalike)});
  for (auto found = first; found; found = findLookalike(text, found->offset + found->length)) {
    diagnostic.fixes.push_back(
        {offset + found->offset, found->length, std::string(found->lookalike->replacement), true});
  }
  return true;
}

bool FaultDescriber::adviseOnNumber(std::uint32_t token, Diagnostic& diagnostic) const {
  const auto advice = describeNumber(tree_.textOf(token), sampleRateHz_, diagnostic);
  if (!advice) return false;
  if (!advice->replacement.empty()) diagnostic.fixes.push_back(replace(token, advice->replacement, advice->isCertain));
  return true;
}

// What a word that may stand in a script is called.
const char* FaultDescriber::kindOf(const std::string& word) const {
  if (traits_.markerNames.contains(word)) return "marker";
  if (traits_.triggerNames.contains(word)) return "trigger";
  const auto isInstruction = [&](TokenType type) { return word == keywordText(type); };
  return std::ranges::any_of(kInstructions, isInstruction) ? "instruction" : "keyword";
}

// A word that is one mistake away from one word alone, and long enough, leaves no doubt.
void FaultDescriber::suggest(const SyntaxFault& fault, Diagnostic& diagnostic) const {
  SyntaxFault place = fault;
  place.kind = fault.wanted;
  const std::string_view word = tree_.textOf(fault.token);
  const NearMiss near = findNearest(word, candidatesAt(place, traits_));
  if (near.text.empty() || near.distance == 0 || !near.isAlone) return;
  const bool isForeign = diagnostic.kind == Kind::kForeignWord;
  const bool isCertain = near.distance == 1 && word.size() >= kLeastCertain && !isForeign;
  if (!isForeign)
    diagnostic.help = std::string("A similar ") + kindOf(near.text) + ": `" + near.text + "`. " + diagnostic.help;
  diagnostic.fixes.push_back(replace(fault.token, near.text, isCertain));
}

void FaultDescriber::relateOpener(std::uint32_t opener, Diagnostic& diagnostic) const {
  if (opener == kNoIndex) return;
  diagnostic.related.push_back({file_.placeOf(tree_.tokens()[opener].offset()), quoted(opener) + " stands here"});
}

std::string FaultDescriber::quoted(std::uint32_t token) const { return quoteWord(tree_.textOf(token)); }

const char* FaultDescriber::nameOfBody(std::uint32_t keyword) const {
  return keyword != kNoIndex && typeOf(keyword) == TokenType::kRepeat ? "loop" : "script";
}

Diagnostic::Fix FaultDescriber::replace(std::uint32_t token, std::string text, bool isCertain) const {
  return {tree_.tokens()[token].offset(), tree_.textOf(token).size(), std::move(text), isCertain};
}

}  // namespace tools
