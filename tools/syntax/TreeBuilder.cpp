#include "tools/syntax/TreeBuilder.h"

#include <utility>

#include "tools/text/nearMiss.h"

namespace tools {
namespace {

using ktwfmscriptcompiler::ScriptTraits;

bool isPunctuation(TokenType type) {
  return type == TokenType::kOpenParenthesis || type == TokenType::kCloseParenthesis || type == TokenType::kComma;
}

NodeKind nodeOf(TokenType keyword) {
  switch (keyword) {
    case TokenType::kGenerate:
      return NodeKind::kGenerate;
    case TokenType::kWait:
      return NodeKind::kWait;
    case TokenType::kRepeat:
      return NodeKind::kRepeat;
    default:
      return NodeKind::kClear;
  }
}

// After "repeat".
bool isLoopArgument(const SyntaxToken& token) {
  const TokenType type = token.type();
  if (token.fault() != TokenFault::kNone) return false;
  return type == TokenType::kInteger || type == TokenType::kForever || type == TokenType::kUntil;
}

bool isInstruction(TokenType type) {
  return type == TokenType::kGenerate || type == TokenType::kWait || type == TokenType::kRepeat ||
         type == TokenType::kClear;
}

}  // namespace

TreeBuilder::TreeBuilder(SyntaxTree& tree, const ScriptTraits& traits)
    : tree_(tree), traits_(traits), vocabulary_(traits), scanner_(tree.text_, vocabulary_) {}

void TreeBuilder::build() {
  take();
  if (tree_.text_.empty()) {
    note(FaultKind::kEmptyText);
  } else {
    do parseScript();
    while (beginsScript());
    if (isFaulty()) note(FaultKind::kToken);
  }
  tree_.unreadFrom_ = current().offset();
}

// Behind a fault a mistyped "script" begins a script as well: the text is refused in any case.
bool TreeBuilder::beginsScript() const {
  if (at(TokenType::kScript)) return true;
  if (tree_.faults_.empty() || !current().isFirstOfLine()) return false;
  SyntaxFault fault;
  fault.kind = FaultKind::kScriptExpected;
  return guess(fault) == TokenType::kScript;
}

void TreeBuilder::parseScript() {
  if (!at(TokenType::kScript)) {
    const SyntaxFault fault = note(FaultKind::kScriptExpected, TokenType::kScript);
    if (guess(fault) != TokenType::kScript) skipToScript();
    if (atEnd()) return;
  }
  open_.push_back({openNode(NodeKind::kScript)});
  const std::uint32_t keyword = index();
  take();
  lacksName(TokenType::kScript) ? parseMisread(TokenType::kScript, keyword) : parseName(TokenType::kScript);
  parseBody();
}

void TreeBuilder::parseBody() {
  while (!open_.empty()) parseNext();
}

void TreeBuilder::parseNext() {
  instruction_ = kNoIndex;
  if (isFaulty()) {
    note(FaultKind::kToken);
    return parseUnexpected();
  }
  const TokenType type = current().type();
  if (isInstruction(type)) return parseInstruction(type);
  if (open_.back().isEmpty || startsInstruction()) {
    note(FaultKind::kInstructionExpected, TokenType::kIdentifier, keywordOf(open_.back()));
    open_.back().isEmpty = false;
    return at(TokenType::kEnd) ? parseEnd() : parseUnexpected();
  }
  if (at(TokenType::kEnd)) return parseEnd();
  note(FaultKind::kEndExpected, TokenType::kEnd, keywordOf(open_.back()));
  parseUnexpected();
}

void TreeBuilder::parseInstruction(TokenType keyword) {
  open_.back().isEmpty = false;
  open_.back().previous = nodeOf(keyword);
  const std::uint32_t node = openNode(nodeOf(keyword));
  take();
  parseArguments(keyword, node);
}

// Of an instruction whose keyword has been taken.
void TreeBuilder::parseArguments(TokenType keyword, std::uint32_t node) {
  instruction_ = node;
  switch (keyword) {
    case TokenType::kGenerate:
      if (lacksName(keyword)) {
        tree_.nodes_[node].hasFault = true;
        closeNode(node);
        return parseMisread(keyword, index() - 1);
      }
      parseGenerate();
      break;
    case TokenType::kWait:
      parseWait();
      break;
    case TokenType::kRepeat:
      return parseRepeat();
    default:
      parseClear();
      break;
  }
  closeNode(node);
}

// A token that no instruction begins with; its fault has been noted.
void TreeBuilder::parseUnexpected() {
  open_.back().isEmpty = false;
  if (atEnd()) return closeAll();
  if (at(TokenType::kScript)) {
    const SyntaxToken next = peek();
    const bool isEnding = next.type() == TokenType::kScript || next.type() == TokenType::kEndOfScript;
    if (isEnding) take();
    return closeAll();
  }
  SyntaxFault fault;
  fault.kind = FaultKind::kEndExpected;
  fault.previous = open_.back().previous;
  const TokenType meant = current().type() == TokenType::kIdentifier ? guess(fault) : current().type();
  if (isInstruction(meant)) return parseInstruction(meant);
  if (meant == TokenType::kEnd) return parseEnd();
  const bool isModifier = meant == TokenType::kSubset || meant == TokenType::kMarkerName;
  if (!isModifier || peek().type() != TokenType::kOpenParenthesis) return skipLine();
  parseModifier(meant == TokenType::kSubset ? NodeKind::kSubset : NodeKind::kMarker);
  parseModifiers(false);
}

void TreeBuilder::parseEnd() {
  take();
  const bool isMisread = at(TokenType::kRepeat) && current().isFirstOfLine() && isLoopArgument(peek());
  if (!isMisread) return parseEndOf();
  const std::uint32_t end = index() - 1;
  closeInnermost();
  if (open_.empty()) return take();
  const std::uint32_t node = openNode(NodeKind::kRepeat);
  take();
  note(FaultKind::kEndMisread, TokenType::kRepeat, end);
  parseArguments(TokenType::kRepeat, node);
}

// Behind "end".
void TreeBuilder::parseEndOf() {
  const TokenType wanted = isLoop(open_.back()) ? TokenType::kRepeat : TokenType::kScript;
  if (!at(wanted)) return parseWrongEnd(wanted);
  take();
  closeInnermost();
}

void TreeBuilder::parseWrongEnd(TokenType wanted) {
  const SyntaxFault fault = note(FaultKind::kEndOfWhat, wanted, keywordOf(open_.back()));
  TokenType meant = current().isFirstOfLine() ? TokenType::kIdentifier : guess(fault);
  if (at(TokenType::kScript) || at(TokenType::kRepeat)) meant = current().type();
  if (meant == TokenType::kRepeat && wanted == TokenType::kScript) return take();  // there is no loop to end
  if (meant == TokenType::kScript && wanted == TokenType::kRepeat) {
    take();
    return startsInstruction() || at(TokenType::kEnd) ? closeInnermost() : closeAll();
  }
  if (meant == wanted || isArgument()) take();
  closeInnermost();
}

void TreeBuilder::parseGenerate() {
  parseName(TokenType::kGenerate);
  parseModifiers(true);
}

void TreeBuilder::parseModifiers(bool mayHaveSubset) {
  if (mayHaveSubset && at(TokenType::kSubset)) parseModifier(NodeKind::kSubset);
  while (at(TokenType::kMarkerName)) parseModifier(NodeKind::kMarker);
}

void TreeBuilder::parseModifier(NodeKind kind) {
  const std::uint32_t keyword = index();
  const std::uint32_t node = openNode(kind);
  const std::uint32_t owner = std::exchange(instruction_, node);
  take();
  parseArguments(kind == NodeKind::kSubset, keyword);
  closeNode(node);
  instruction_ = owner;
}

void TreeBuilder::parseArguments(bool isSubset, std::uint32_t opener) {
  if (at(TokenType::kOpenParenthesis)) {
    take();
  } else {
    note(FaultKind::kMarkExpected, TokenType::kOpenParenthesis, opener);
    if (current().type() != TokenType::kInteger) return;
  }
  for (unsigned count = 1;; ++count) {
    if (!parseNumber(opener)) return;
    if (isSubset && count == 2) break;
    if (at(TokenType::kComma)) {
      take();
    } else if (isSubset) {
      note(FaultKind::kMarkExpected, TokenType::kComma, opener);
      if (current().type() != TokenType::kInteger) break;
    } else {
      break;
    }
  }
  parseClosing(opener);
}

// False when what stands there is no argument at all.
bool TreeBuilder::parseNumber(std::uint32_t opener) {
  if (!at(TokenType::kInteger)) note(FaultKind::kNumberExpected, TokenType::kInteger, opener);
  if (at(TokenType::kComma) || at(TokenType::kCloseParenthesis)) return true;
  if (at(TokenType::kInteger) || isArgument()) {
    take();
    return true;
  }
  return false;
}

void TreeBuilder::parseClosing(std::uint32_t opener) {
  if (!at(TokenType::kCloseParenthesis)) {
    note(FaultKind::kMarkExpected, TokenType::kCloseParenthesis, opener);
    while (!current().isFirstOfLine() && (current().type() == TokenType::kInteger || at(TokenType::kComma))) take();
  }
  if (at(TokenType::kCloseParenthesis)) take();
}

void TreeBuilder::parseWait() {
  if (at(TokenType::kUntil)) {
    take();
    parseTrigger();
  } else if (at(TokenType::kInteger)) {
    take();
  } else {
    const SyntaxFault fault = note(FaultKind::kWaitArgument);
    if (guess(fault) == TokenType::kUntil) {
      take();
      parseTrigger();
    } else if (isArgument()) {
      take();
    }
  }
  parseModifiers(false);
}

void TreeBuilder::parseRepeat() {
  const std::uint32_t node = instruction_;
  if (at(TokenType::kForever) || at(TokenType::kInteger)) {
    take();
  } else if (at(TokenType::kUntil)) {
    take();
    parseTrigger();
  } else {
    const SyntaxFault fault = note(FaultKind::kRepeatArgument);
    const TokenType meant = guess(fault);
    const bool isEnding = isLoop(open_.back()) && (current().isFirstOfLine() || atEnd()) && lacksEnds();
    if (isEnding && meant == TokenType::kIdentifier) {  // an "end repeat" without its "end"
      closeNode(node);
      tree_.nodes_[node].kind = NodeKind::kSkipped;
      return closeInnermost();
    }
    if (meant != TokenType::kIdentifier || isArgument()) take();
    if (meant == TokenType::kUntil) parseTrigger();
  }
  open_.push_back({node});
}

void TreeBuilder::parseClear() {
  do parseTrigger();
  while (at(TokenType::kTriggerName));
}

// A faulty word is taken for the name that it should be.
void TreeBuilder::parseName(TokenType owner) {
  if (!isName()) note(FaultKind::kNameExpected, owner);
  if (isFaulty() || isName() || at(TokenType::kInteger)) take();
}

// Whether the name was forgotten and a keyword of the next line would be read as one, which fails right behind it.
bool TreeBuilder::lacksName(TokenType owner) const {
  const TokenType type = current().type();
  if (isFaulty() || !current().isFirstOfLine() || !(isInstruction(type) || type == TokenType::kEnd)) return false;
  Scanner ahead(scanner_);
  const SyntaxToken next = ahead.next();
  if (next.fault() != TokenFault::kNone) return true;
  if (type == TokenType::kEnd) {
    return next.type() == TokenType::kScript || (next.type() == TokenType::kRepeat && !isLoopArgument(ahead.next()));
  }
  if (isInstruction(next.type())) return false;
  const bool isModifier = next.type() == TokenType::kSubset || next.type() == TokenType::kMarkerName;
  return owner == TokenType::kScript || !(isModifier || next.type() == TokenType::kEnd);
}

// Reads that keyword as one. The fault is where the compiler finds it: behind what it takes for the name.
void TreeBuilder::parseMisread(TokenType owner, std::uint32_t opener) {
  const TokenType keyword = current().type();
  if (keyword == TokenType::kEnd) {
    take();
    if (isFaulty()) note(FaultKind::kToken);
    if (at(TokenType::kRepeat) || isArgument()) take();
    note(FaultKind::kNameMisread, owner, opener);
    if (at(TokenType::kScript)) return parseEndOf();
    return isLoop(open_.back()) ? closeInnermost() : void();
  }
  open_.back().isEmpty = false;
  open_.back().previous = nodeOf(keyword);
  const std::uint32_t node = openNode(nodeOf(keyword));
  take();
  note(FaultKind::kNameMisread, owner, opener);
  parseArguments(keyword, node);
}

// Whether the rest of the script, as far as one looks, has fewer loop ends than this loop and those around it need.
bool TreeBuilder::lacksEnds() const {
  constexpr int kMostTokens = 4096;
  Scanner ahead(scanner_);
  std::size_t needed = open_.size();  // the script has an end of its own
  for (int count = 0; count < kMostTokens && needed > 0; ++count) {
    const TokenType type = ahead.next().type();
    const SyntaxToken next = Scanner(ahead).next();
    if (type == TokenType::kScript || type == TokenType::kEndOfScript) return true;
    if (type == TokenType::kRepeat) isLoopArgument(next) ? ++needed : --needed;
    const bool endsSomething = next.type() != TokenType::kRepeat && next.type() != TokenType::kScript;
    if (type == TokenType::kEnd && endsSomething) --needed;
  }
  return false;
}

void TreeBuilder::parseTrigger() {
  if (!at(TokenType::kTriggerName)) note(FaultKind::kTriggerExpected);
  if (at(TokenType::kTriggerName) || isArgument()) take();
}

// Three of these begin no instruction that exists.
bool TreeBuilder::startsInstruction() const {
  return isInstruction(current().type()) || at(TokenType::kIf) || at(TokenType::kBreak) || at(TokenType::kStream);
}

bool TreeBuilder::isName() const {
  const TokenType type = current().type();
  return !isFaulty() && !isPunctuation(type) && type != TokenType::kInteger && type != TokenType::kEndOfScript;
}

bool TreeBuilder::isArgument() const {
  const TokenType type = current().type();
  if (current().isFirstOfLine() || atEnd() || isPunctuation(type)) return false;
  return isFaulty() || !(startsInstruction() || type == TokenType::kEnd || type == TokenType::kScript);
}

SyntaxFault TreeBuilder::note(FaultKind kind, TokenType expected, std::uint32_t opener) {
  const NodeKind previous = open_.empty() ? NodeKind::kSkipped : open_.back().previous;
  const SyntaxFault fault = {isFaulty() ? FaultKind::kToken : kind, kind, expected, previous, index(), opener};
  if (instruction_ != kNoIndex) tree_.nodes_[instruction_].hasFault = true;
  if (!open_.empty()) tree_.nodes_[open_.back().node].hasFault = true;
  if (lastFault_ != index() && tree_.faults_.size() < SyntaxTree::kMostFaults) tree_.faults_.push_back(fault);
  lastFault_ = index();
  SyntaxFault wanted = fault;
  wanted.kind = kind;
  return wanted;
}

TokenType TreeBuilder::guess(const SyntaxFault& fault) const {
  if (isPunctuation(current().type()) || atEnd()) return TokenType::kIdentifier;
  const std::string nearMiss = findNearMiss(tree_.textOf(index()), candidatesAt(fault, traits_));
  return nearMiss.empty() ? TokenType::kIdentifier : vocabulary_.find(nearMiss).type;
}

// To the next line, or to what begins or ends something before that.
void TreeBuilder::skipLine() {
  const std::uint32_t node = openNode(NodeKind::kSkipped);
  do take();
  while (!atEnd() && !current().isFirstOfLine() && !startsInstruction() && !at(TokenType::kEnd) &&
         !at(TokenType::kScript));
  closeNode(node);
}

void TreeBuilder::skipToScript() {
  const std::uint32_t node = openNode(NodeKind::kSkipped);
  bool isBehindEnd = false;
  while (!atEnd() && (!at(TokenType::kScript) || isBehindEnd)) {
    isBehindEnd = at(TokenType::kEnd);
    take();
  }
  closeNode(node);
}

std::uint32_t TreeBuilder::openNode(NodeKind kind) {
  tree_.nodes_.push_back({index(), index(), 0, kind, false});
  return static_cast<std::uint32_t>(tree_.nodes_.size() - 1);
}

void TreeBuilder::closeNode(std::uint32_t node) {
  tree_.nodes_[node].endToken = index();
  tree_.nodes_[node].endNode = static_cast<std::uint32_t>(tree_.nodes_.size());
}

void TreeBuilder::closeInnermost() {
  closeNode(open_.back().node);
  open_.pop_back();
  if (!open_.empty()) open_.back().previous = NodeKind::kRepeat;
}

void TreeBuilder::closeAll() {
  while (!open_.empty()) closeInnermost();
}

}  // namespace tools
