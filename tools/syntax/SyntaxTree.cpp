#include "tools/syntax/SyntaxTree.h"

#include "ktWfmScriptCompiler/Keywords.h"
#include "ktWfmScriptCompiler/ScriptFailure.h"
#include "tools/syntax/Scanner.h"
#include "tools/syntax/TreeBuilder.h"
#include "tools/text/words.h"

namespace tools {
namespace {

using ktwfmscriptcompiler::keywordText;
using ktwfmscriptcompiler::NameMap;

void addWords(std::vector<std::string>& words, std::initializer_list<TokenType> keywords) {
  for (const TokenType keyword : keywords) words.emplace_back(keywordText(keyword));
}

void addNames(std::vector<std::string>& words, const NameMap& names) {
  for (const auto& [name, number] : names) words.push_back(name);
}

}  // namespace

SyntaxTree::SyntaxTree(std::string_view text, const ktwfmscriptcompiler::ScriptTraits& traits) : text_(text) {
  TreeBuilder(*this, traits).build();
}

std::string_view SyntaxTree::textOf(std::uint32_t token) const {
  const SyntaxToken& at = tokens_[token];
  const bool isLong = at.length() == SyntaxToken::kLongest;
  return text_.substr(at.offset(), isLong ? endOfChunk(text_, at.offset()) - at.offset() : at.length());
}

std::uint32_t SyntaxTree::valueOf(std::uint32_t token) const {
  return parseInteger<std::uint32_t>(textOf(token)).value_or(0);
}

// Behind the slash of a lone one, where the second should be.
std::size_t SyntaxTree::offsetOf(const SyntaxFault& fault) const {
  const SyntaxToken& token = tokens_[fault.token];
  const bool isSlash = fault.kind == FaultKind::kToken && token.fault() == TokenFault::kLoneSlash;
  return token.offset() + (isSlash ? 1u : 0u);
}

const kterr::ErrorConstant& SyntaxTree::constantOf(const SyntaxFault& fault) const {
  using namespace ktwfmscriptcompiler_errors;
  if (fault.kind == FaultKind::kNameExpected) return kErrorScriptHasInvalidIdentifier;
  if (fault.kind == FaultKind::kNumberExpected) return kErrorIntegerExpectedInScript;
  if (fault.kind != FaultKind::kToken) return kErrorKeywordExpectedInScript;
  switch (tokens_[fault.token].fault()) {
    case TokenFault::kBadCharacter:
      return kErrorScriptHasInvalidCharacter;
    case TokenFault::kNoName:
      return kErrorScriptHasInvalidIdentifier;
    case TokenFault::kTooLarge:
      return kErrorIntegerExpectedInScript;
    default:
      return kErrorKeywordExpectedInScript;
  }
}

std::vector<std::string> candidatesAt(const SyntaxFault& fault, const ktwfmscriptcompiler::ScriptTraits& traits) {
  std::vector<std::string> words;
  switch (fault.kind) {
    case FaultKind::kScriptExpected:
      addWords(words, {TokenType::kScript});
      break;
    case FaultKind::kToken:
    case FaultKind::kInstructionExpected:
    case FaultKind::kEndExpected:
      addWords(words, {TokenType::kGenerate, TokenType::kWait, TokenType::kRepeat, TokenType::kClear});
      if (fault.kind != FaultKind::kInstructionExpected) addWords(words, {TokenType::kEnd});
      if (fault.previous == NodeKind::kGenerate) addWords(words, {TokenType::kSubset});
      if (fault.previous == NodeKind::kGenerate || fault.previous == NodeKind::kWait)
        addNames(words, traits.markerNames);
      if (fault.previous == NodeKind::kClear) addNames(words, traits.triggerNames);
      break;
    case FaultKind::kEndOfWhat:
      addWords(words, {fault.expected});
      addWords(words, {TokenType::kRepeat, TokenType::kScript});
      break;
    case FaultKind::kTriggerExpected:
      addNames(words, traits.triggerNames);
      break;
    case FaultKind::kWaitArgument:
      addWords(words, {TokenType::kUntil});
      break;
    case FaultKind::kRepeatArgument:
      addWords(words, {TokenType::kForever, TokenType::kUntil});
      break;
    default:
      break;
  }
  return words;
}

}  // namespace tools
