#include "ktWfmScriptCompiler/ParserImpl.h"

#include "ktWfmScriptCompiler/Keywords.h"
#include "ktWfmScriptCompiler/ScriptFailure.h"

namespace ktwfmscriptcompiler {
namespace {

constexpr char kSource[] = R"(ktWfmScriptCompiler\ParserImpl)";

// What stands in an error report where an instruction, or the argument of a wait or repeat, should begin: frozen texts.
constexpr char kInstructionKeywords[] = "generate, wait, repeat, clear";
constexpr char kWaitArguments[] = "1,2,... , until";
constexpr char kRepeatArguments[] = "1,2,3..., forever";

std::string joinedKeys(const NameMap& names) {
  std::string joined;
  for (const auto& [name, number] : names) joined += (joined.empty() ? "" : ", ") + name;
  return joined;
}

}  // namespace

ParserImpl::ParserImpl(const ScriptTraits& traits, LexerInterface* lexer) : traits_(traits), lexer_(lexer) {}

std::unique_ptr<iParseTree> ParserImpl::parse(const std::string& text) {
  if (text.empty()) {
    kterr::Failure(ktwfmscriptcompiler_errors::kErrorKeywordExpectedInScript).at(kSource).raise();
  }
  auto tree = std::make_unique<ProcedureCollection>();
  tree_ = tree.get();
  lexer_->setScript(text);
  advance();
  parseProcedureCollection();
  return tree;
}

void ParserImpl::parseProcedureCollection() {
  do {
    tree_->procedures.append(parseNamedProcedure());
  } while (at(TokenType::kScript));
}

NamedProcedure& ParserImpl::parseNamedProcedure() {
  auto& procedure = createNode<NamedProcedure>();
  expect(TokenType::kScript);
  procedure.name = parseName();
  parseInstructions(procedure);
  expect(TokenType::kEnd);
  expect(TokenType::kScript);
  return procedure;
}

// Keeps the open loops on a stack of its own, so that no text can nest too deep to be read.
void ParserImpl::parseInstructions(InstructionContainer& body) {
  std::vector<InstructionContainer*> openContainers{&body};
  for (;;) {
    InstructionContainer& container = *openContainers.back();
    if (container.instructions.empty() || startsInstruction()) {
      parseInstruction(container, openContainers);
    } else {
      openContainers.pop_back();
      if (openContainers.empty()) return;
      expect(TokenType::kEnd);
      expect(TokenType::kRepeat);
    }
  }
}

// Opens the body of a repeat, which is read with its "end repeat" by parseInstructions.
void ParserImpl::parseInstruction(InstructionContainer& container, std::vector<InstructionContainer*>& openContainers) {
  switch (currentToken_.type) {
    case TokenType::kGenerate:
      return container.instructions.append(parseGenerate());
    case TokenType::kWait:
      return container.instructions.append(parseWait());
    case TokenType::kClear:
      return container.instructions.append(parseClear());
    case TokenType::kRepeat: {
      RepeatInstruction& repeat = parseRepeat();
      container.instructions.append(repeat);
      openContainers.push_back(&repeat);
      return;
    }
    default:
      raiseKeywordExpected(kInstructionKeywords);
  }
}

GenerateInstruction& ParserImpl::parseGenerate() {
  auto& generate = createNode<GenerateInstruction>();
  advance();
  generate.waveformName = parseName();
  if (at(TokenType::kSubset)) generate.subset = &parseSubset();
  parseMarkers(generate);
  return generate;
}

SubsetModifier& ParserImpl::parseSubset() {
  auto& subset = createNode<SubsetModifier>();
  expect(TokenType::kSubset);
  expect(TokenType::kOpenParenthesis);
  subset.startOffset = parseInteger();
  expect(TokenType::kComma);
  subset.length = parseInteger();
  expect(TokenType::kCloseParenthesis);
  return subset;
}

void ParserImpl::parseMarkers(FetchInstruction& fetch) {
  while (at(TokenType::kMarkerName)) fetch.markers.append(parseMarker());
}

MarkerModifier& ParserImpl::parseMarker() {
  auto& marker = createNode<MarkerModifier>();
  marker.markerNumber = takeValue();
  expect(TokenType::kOpenParenthesis);
  numbers_.clear();
  do {
    numbers_.push_back(parseInteger());
  } while (matchToken(TokenType::kComma));
  expect(TokenType::kCloseParenthesis);
  marker.positions = tree_->store(numbers_);
  return marker;
}

WaitInstruction& ParserImpl::parseWait() {
  auto& wait = createNode<WaitInstruction>();
  advance();
  if (matchToken(TokenType::kUntil)) {
    wait.waitType = WaitType::kUntilTrigger;
    wait.trigger = parseTriggerNumber();
  } else if (at(TokenType::kInteger)) {
    wait.sampleCount = takeValue();
  } else {
    raiseKeywordExpected(kWaitArguments);
  }
  parseMarkers(wait);
  return wait;
}

RepeatInstruction& ParserImpl::parseRepeat() {
  auto& repeat = createNode<RepeatInstruction>();
  advance();
  if (matchToken(TokenType::kForever)) {
    repeat.repeatType = RepeatType::kForever;
  } else if (matchToken(TokenType::kUntil)) {
    repeat.repeatType = RepeatType::kUntilTrigger;
    repeat.trigger = parseTriggerNumber();
  } else if (at(TokenType::kInteger)) {
    repeat.iterationCount = takeValue();
  } else {
    raiseKeywordExpected(kRepeatArguments);
  }
  return repeat;
}

ClearInstruction& ParserImpl::parseClear() {
  auto& clear = createNode<ClearInstruction>();
  advance();
  numbers_.clear();
  do {
    numbers_.push_back(parseTriggerNumber());
  } while (at(TokenType::kTriggerName));
  clear.triggers = tree_->store(numbers_);
  return clear;
}

std::string_view ParserImpl::parseName() {
  if (!isWordToken()) {
    ScriptFailure(ktwfmscriptcompiler_errors::kErrorScriptHasInvalidIdentifier, kSource, currentToken_.position)
        .usage(kterr::kUsageTypeBadValue, std::string(currentToken_.text))
        .raise();
  }
  const std::string_view name = tree_->store(currentToken_.text);
  advance();
  return name;
}

std::uint32_t ParserImpl::parseInteger() {
  if (!at(TokenType::kInteger)) {
    ScriptFailure(ktwfmscriptcompiler_errors::kErrorIntegerExpectedInScript, kSource, currentToken_.position)
        .usage(kterr::kUsageTypeBadValue, std::string(currentToken_.text))
        .raise();
  }
  return takeValue();
}

std::uint32_t ParserImpl::parseTriggerNumber() {
  if (!at(TokenType::kTriggerName)) raiseKeywordExpected(joinedKeys(traits_.triggerNames));
  return takeValue();
}

bool ParserImpl::matchToken(TokenType type) {
  if (!at(type)) return false;
  advance();
  return true;
}

void ParserImpl::expect(TokenType type) {
  if (!matchToken(type)) raiseKeywordExpected(keywordText(type));
}

// Three of these begin no instruction that exists; they are refused as instructions, not as the end of a body.
bool ParserImpl::startsInstruction() const {
  switch (currentToken_.type) {
    case TokenType::kGenerate:
    case TokenType::kWait:
    case TokenType::kRepeat:
    case TokenType::kClear:
    case TokenType::kIf:
    case TokenType::kBreak:
    case TokenType::kStream:
      return true;
    default:
      return false;
  }
}

bool ParserImpl::isWordToken() const {
  switch (currentToken_.type) {
    case TokenType::kInteger:
    case TokenType::kOpenParenthesis:
    case TokenType::kCloseParenthesis:
    case TokenType::kComma:
    case TokenType::kEndOfScript:
      return false;
    default:
      return true;
  }
}

std::uint32_t ParserImpl::takeValue() {
  const std::uint32_t value = currentToken_.value;
  advance();
  return value;
}

template <typename Node>
Node& ParserImpl::createNode() {
  return tree_->create<Node>(currentToken_.position);
}

void ParserImpl::raiseKeywordExpected(const std::string& possibleKeywords) const {
  ScriptFailure(ktwfmscriptcompiler_errors::kErrorKeywordExpectedInScript, kSource, currentToken_.position)
      .usage(kterr::kUsageTypeBadValue, std::string(currentToken_.text))
      .usage(kterr::kUsageTypePossibleKeywords, possibleKeywords)
      .raise();
}

}  // namespace ktwfmscriptcompiler
