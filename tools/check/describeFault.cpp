#include "tools/check/describeFault.h"

#include <algorithm>

#include "ktWfmScriptCompiler/ByteClass.h"
#include "ktWfmScriptCompiler/Keywords.h"
#include "kterr/hexText.h"
#include "kterr/usageTags.h"
#include "tools/check/describeNumber.h"
#include "tools/check/foreignWords.h"
#include "tools/check/lookalikes.h"
#include "tools/diagnostics/elaboration.h"
#include "tools/text/nearMiss.h"
#include "tools/text/words.h"

namespace tools {
namespace {

using ktwfmscriptcompiler::keywordText;

constexpr std::size_t kLongestQuote = 40;  // bytes
constexpr std::size_t kLeastCertain = 4;   // letters of a word that one mistake leaves no doubt about

std::string quote(std::string_view text) {
  std::string shown(text.substr(0, text.find_first_of("\r\n")));
  if (shown.size() > kLongestQuote) shown = shown.substr(0, kLongestQuote) + "\u2026";
  return "`" + shown + "`";
}

struct CharacterAdvice {
  char character;
  const char* message;
  const char* help;
};
constexpr CharacterAdvice kCharacters[] = {
    {'#', "a comment begins with //", "Put // in place of #."},
    {';', "`;` ends nothing in a script", "Parts stand apart by blanks and lines."},
    {'"', "names and texts have no quotes", "Write the name alone."},
    {'\'', "names and texts have no quotes", "Write the name alone."},
    {'{', "a body has no braces", "It ends with end repeat or end script."},
    {'}', "a body has no braces", "It ends with end repeat or end script."},
    {'[', "parts are given in parentheses", "Write subset(0, 64), marker0(0)."},
    {']', "parts are given in parentheses", "Write subset(0, 64), marker0(0)."},
    {'_', "a name in a script has no `_`", "Names are letters and digits that begin with a letter."},
    {'-', "a name in a script has no `-`", "Names are letters and digits that begin with a letter."},
    {'.', "a name in a script has no `.`", "Names are letters and digits that begin with a letter."},
    {'=', "nothing is assigned in a script", "Write what is played, one instruction behind the other."},
};

std::string nameOfByte(char byte) {
  const auto value = static_cast<unsigned char>(byte);
  if (value >= 0x21 && value < 0x7F) return std::string("`") + byte + "`";
  return "the byte " + kterr::hexText(value, 2);
}

// How the rules are told: by the constant, with the values that follow line and position put in for {0} and {1}.
struct RuleWords {
  std::int32_t code;
  std::string_view message;
  std::string_view help;
};
namespace errors = ktwfmscriptcompiler_errors;
constexpr RuleWords kRules[] = {
    {errors::kErrorLoopOrProcedureWithNoSamplesGenerated.code, "nothing is played in this body",
     "Every script and loop needs a generate, a wait with a number, or a loop."},
    {errors::kErrorInvalidSubsetLengthInScript.code, "a subset of no samples",
     "The second number is the length: at least 1."},
    {errors::kErrorMarkerNotSupportedInWait.code, "a wait for a trigger has no length, and so no place for a marker",
     "Put the marker behind a generate or a wait with a number."},
    {errors::kErrorClearIsLastInstructionOfLoopInScript.code, "this clear ends a loop and acts on nothing",
     "Put it in front of the instruction that it shall act with."},
    {errors::kErrorInvalidLoopIterationsInScript.code, "a loop runs at least once", "Write repeat 1 or more."},
    {errors::kErrorNumSampsToWaitNotGreaterThanMinWaitLengthInScript.code, "a wait of {0} samples is too short",
     "Wait at least {1} samples."},
    {errors::kErrorMarkerPositionOutsideSubsetInScript.code, "a marker lies behind the end of what is played",
     "Its positions count from 0 and lie below the length."},
    {errors::kErrorRepeatLoopNestingTooDeepInScript.code, "a loop stands in a loop",
     "Only a repeat forever that is a script's whole body may hold loops."},
};

std::string fillIn(std::string_view pattern, const ElaborationRecord& record) {
  std::string text(pattern);
  constexpr std::size_t kFirst = 2;
  for (std::size_t i = kFirst; i < record.values.size(); ++i) {
    const std::string mark = "{" + std::to_string(i - kFirst) + "}";
    const std::size_t at = text.find(mark);
    if (at != std::string::npos) text.replace(at, mark.size(), record.values[i].text);
  }
  return text;
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
  const auto words = std::ranges::find(kRules, fault.code, &RuleWords::code);
  if (words == std::end(kRules)) {
    diagnostic.message = findErrorConstant(fault.code)->meaning;
    diagnostic.help = "Use multiples of the generator's alignment quantum.";
  } else {
    diagnostic.message = fillIn(words->message, fault.record);
    diagnostic.help = fillIn(words->help, fault.record);
  }
  if (fault.opener != kNoIndex) relateOpener(fault.opener, diagnostic);
  return diagnostic;
}

void FaultDescriber::describeToken(const SyntaxFault& fault, Diagnostic& diagnostic) const {
  const std::string_view text = tree_.textOf(fault.token);
  if (tree_.tokens()[fault.token].fault() == TokenFault::kLoneSlash) {
    diagnostic.length = 1;
    diagnostic.message = text.starts_with("/*") ? "a comment begins with // and ends with its line" : "a single `/`";
    diagnostic.help = "Comments are written // like this; there is no other use for a slash.";
    return;
  }
  const bool isName = fault.wanted == FaultKind::kNameExpected;
  if (!isName && typeOf(fault.token) == TokenType::kInteger && adviseOnNumber(fault.token, diagnostic)) return;
  if (tree_.tokens()[fault.token].fault() == TokenFault::kBadCharacter) return describeCharacter(fault, diagnostic);
  diagnostic.message = quote(text) + (isName ? " is no name" : " is neither a name nor a number");
  diagnostic.help = isName ? "Names begin with a letter." : "Names begin with a letter; numbers are digits alone.";
}

void FaultDescriber::describeCharacter(const SyntaxFault& fault, Diagnostic& diagnostic) const {
  const std::string_view text = tree_.textOf(fault.token);
  const auto bad = std::ranges::find(text, ktwfmscriptcompiler::ByteClass::kInvalid, ktwfmscriptcompiler::classOf);
  const auto advice = std::ranges::find(kCharacters, *bad, &CharacterAdvice::character);
  if (advice != std::end(kCharacters)) {
    diagnostic.message = advice->message;
    diagnostic.help = advice->help;
  } else {
    diagnostic.message = nameOfByte(*bad) + " has no place in a script";
    diagnostic.help = "Scripts are letters, digits, parentheses, commas, blanks and // comments.";
  }
  if (*bad != '#') suggest(fault, diagnostic);
}

void FaultDescriber::describeGrammar(const SyntaxFault& fault, Diagnostic& diagnostic) const {
  const std::string word = quoted(fault.token);
  switch (fault.kind) {
    case FaultKind::kEmptyText:
      diagnostic.message = "the text is empty";
      diagnostic.help = "A script is written: script NAME ... end script.";
      return;
    case FaultKind::kScriptExpected:
      diagnostic.message = isAtEnd(fault) ? "the text holds no script" : word + " stands outside of any script";
      diagnostic.help = "A script is written: script NAME ... end script.";
      return suggest(fault, diagnostic);
    case FaultKind::kNameExpected:
      diagnostic.message = std::string("the name of a ") +
                           (fault.expected == TokenType::kScript ? "script" : "waveform") + " is missing";
      diagnostic.help = "Names are letters and digits that begin with a letter.";
      return;
    case FaultKind::kNameMisread:
      diagnostic.message = std::string("the name of a ") +
                           (fault.expected == TokenType::kScript ? "script" : "waveform") + " is missing";
      diagnostic.help = "It was looked for up to here: a keyword may be a name.";
      return relateOpener(fault.opener, diagnostic);
    case FaultKind::kEndMisread:
      diagnostic.message = "end of what? A loop begins behind it";
      diagnostic.help = "Write end repeat or end script.";
      return relateOpener(fault.opener, diagnostic);
    case FaultKind::kInstructionExpected:
    case FaultKind::kEndExpected:
      return describeStranger(fault, diagnostic);
    case FaultKind::kEndOfWhat:
      return describeEnd(fault, diagnostic);
    case FaultKind::kMarkExpected:
      return describeMark(fault, diagnostic);
    case FaultKind::kNumberExpected:
      diagnostic.message =
          typeOf(fault.token) == TokenType::kIdentifier ? word + " is no number" : "a number is missing";
      diagnostic.help = "Numbers are digits alone, from 0 to 2147483647.";
      return relateOpener(fault.opener, diagnostic);
    case FaultKind::kTriggerExpected:
      diagnostic.message =
          typeOf(fault.token) == TokenType::kIdentifier ? word + " is no trigger" : "a trigger is missing";
      diagnostic.help = "Triggers are " + join(candidatesAt(fault, traits_)) + ".";
      return suggest(fault, diagnostic);
    case FaultKind::kWaitArgument:
      diagnostic.message = "wait for how long?";
      diagnostic.help = "Write wait 1000 for samples, or wait until trigger1.";
      return suggest(fault, diagnostic);
    default:
      diagnostic.message = "repeat how often?";
      diagnostic.help = "Write repeat 10, repeat forever or repeat until trigger1.";
      return suggest(fault, diagnostic);
  }
}

// What begins no instruction where one could stand.
void FaultDescriber::describeStranger(const SyntaxFault& fault, Diagnostic& diagnostic) const {
  const TokenType type = typeOf(fault.token);
  const std::string word = quoted(fault.token);
  if (isAtEnd(fault) || type == TokenType::kScript) return describeMissingEnd(fault, diagnostic);
  const std::string_view advice = explainForeignWord(tree_.textOf(fault.token));
  diagnostic.help = "Instructions are generate, wait, repeat and clear.";
  switch (type) {
    case TokenType::kEnd:
      diagnostic.message = std::string("the ") + nameOfBody(fault.opener) + " is empty";
      diagnostic.help = "It needs an instruction: generate, wait, repeat or clear.";
      return relateOpener(fault.opener, diagnostic);
    case TokenType::kSubset:
      diagnostic.message = "a subset has no place here";
      diagnostic.help =
          "It stands behind the name of a waveform, in front of the markers: generate pulse subset(0, 64).";
      return;
    case TokenType::kMarkerName:
      diagnostic.message = "a marker has no place here";
      diagnostic.help = "Markers stand behind a generate or a wait with a number.";
      return;
    case TokenType::kTriggerName:
      diagnostic.message = "a trigger has no place here";
      diagnostic.help = "Triggers stand behind until and clear.";
      return;
    case TokenType::kIdentifier:
      diagnostic.message = "unknown instruction " + word;
      break;
    case TokenType::kIf:
    case TokenType::kElse:
    case TokenType::kBreak:
    case TokenType::kOn:
    case TokenType::kStream:
      diagnostic.message = word + " is a reserved word and no instruction";
      break;
    default:
      diagnostic.message = word + " has no place here";
      break;
  }
  suggest(fault, diagnostic);
  if (!advice.empty()) diagnostic.help = advice;
}

void FaultDescriber::describeMissingEnd(const SyntaxFault& fault, Diagnostic& diagnostic) const {
  const std::string body = nameOfBody(fault.opener);
  const bool isEmpty = fault.kind == FaultKind::kInstructionExpected;
  diagnostic.message = "the " + body + (isEmpty ? " has no instruction and is never ended" : " is never ended");
  diagnostic.help = typeOf(fault.opener) == TokenType::kRepeat ? "Write end repeat behind its last instruction."
                                                               : "Write end script behind its last instruction.";
  relateOpener(fault.opener, diagnostic);
}

void FaultDescriber::describeEnd(const SyntaxFault& fault, Diagnostic& diagnostic) const {
  const TokenType type = typeOf(fault.token);
  const bool isLoop = fault.expected == TokenType::kRepeat;
  diagnostic.help =
      isLoop ? "Write end repeat: the innermost that is open is a loop." : "Write end script: no loop is open here.";
  if (type == TokenType::kScript && isLoop) {
    diagnostic.message = "the loop is not ended before its script is";
  } else if (type == TokenType::kRepeat && !isLoop) {
    diagnostic.message = "there is no loop to end";
  } else if (type == TokenType::kIdentifier) {
    diagnostic.message = "end of what: " + quoted(fault.token) + "?";
  } else {
    diagnostic.message = "end of what?";
  }
  suggest(fault, diagnostic);
  relateOpener(fault.opener, diagnostic);
}

void FaultDescriber::describeMark(const SyntaxFault& fault, Diagnostic& diagnostic) const {
  const std::string mark = keywordText(fault.expected);
  const bool isSubset = fault.opener != kNoIndex && typeOf(fault.opener) == TokenType::kSubset;
  diagnostic.message = "`" + mark + "` is missing";
  if (fault.expected == TokenType::kCloseParenthesis && typeOf(fault.token) == TokenType::kInteger) {
    diagnostic.message = "numbers are parted by commas";
  } else if (fault.expected == TokenType::kCloseParenthesis && typeOf(fault.token) == TokenType::kComma) {
    diagnostic.message = "a subset has two numbers";
  } else if (fault.expected == TokenType::kComma) {
    diagnostic.message = "a subset has two numbers, parted by a comma";
  }
  diagnostic.help = isSubset ? "Write subset(OFFSET, LENGTH), in samples." : "Write marker0(POSITION, POSITION).";
  relateOpener(fault.opener, diagnostic);
}

bool FaultDescriber::describeLookalike(const SyntaxFault& fault, Diagnostic& diagnostic) const {
  const std::string_view text = tree_.textOf(fault.token);
  const std::size_t offset = tree_.tokens()[fault.token].offset();
  const auto first = findLookalike(text);
  if (!first) return false;
  const std::string_view type = first->lookalike->replacement;
  diagnostic.place = file_.placeOf(offset + first->offset);
  diagnostic.length = static_cast<std::uint32_t>(first->length);
  diagnostic.message = "a " + std::string(first->lookalike->name) + " (U+" +
                       kterr::hexText(first->lookalike->codePoint, 4).substr(2) + ") is a letter to a script";
  diagnostic.help =
      type.empty() ? "Remove it." : "Type " + (type == " " ? "a blank" : "`" + std::string(type) + "`") + " instead.";
  for (auto found = first; found; found = findLookalike(text, found->offset + found->length)) {
    diagnostic.fixes.push_back(
        {offset + found->offset, found->length, std::string(found->lookalike->replacement), true});
  }
  return true;
}

bool FaultDescriber::adviseOnNumber(std::uint32_t token, Diagnostic& diagnostic) const {
  const auto advice = describeNumber(tree_.textOf(token), sampleRateHz_);
  if (!advice) return false;
  diagnostic.message = advice->message;
  diagnostic.help = advice->help;
  if (!advice->replacement.empty()) diagnostic.fixes.push_back(replace(token, advice->replacement, advice->isCertain));
  return true;
}

// A word that is one mistake away from one word alone, and long enough, leaves no doubt.
void FaultDescriber::suggest(const SyntaxFault& fault, Diagnostic& diagnostic) const {
  SyntaxFault place = fault;
  place.kind = fault.wanted;
  const std::string_view word = tree_.textOf(fault.token);
  const auto candidates = candidatesAt(place, traits_);
  const NearMiss near = findNearest(word, candidates);
  if (near.text.empty() || near.distance == 0) return;
  const bool isCertain = near.isAlone && near.distance == 1 && word.size() >= kLeastCertain;
  if (near.isAlone) {
    diagnostic.help = "A similar word: `" + near.text + "`. " + diagnostic.help;
    diagnostic.fixes.push_back(replace(fault.token, near.text, isCertain));
  }
}

void FaultDescriber::relateOpener(std::uint32_t opener, Diagnostic& diagnostic) const {
  if (opener == kNoIndex) return;
  diagnostic.related.push_back({file_.placeOf(tree_.tokens()[opener].offset()), quoted(opener) + " stands here"});
}

std::string FaultDescriber::quoted(std::uint32_t token) const { return quote(tree_.textOf(token)); }

const char* FaultDescriber::nameOfBody(std::uint32_t keyword) const {
  return keyword != kNoIndex && typeOf(keyword) == TokenType::kRepeat ? "loop" : "script";
}

Diagnostic::Fix FaultDescriber::replace(std::uint32_t token, std::string text, bool isCertain) const {
  return {tree_.tokens()[token].offset(), tree_.textOf(token).size(), std::move(text), isCertain};
}

}  // namespace tools
