#include "tools/check/RuleChecker.h"

#include <algorithm>
#include <deque>

#include "kterr/Exception.h"

namespace tools {
namespace {

using ktwfmscriptcompiler::GenerateInstruction;
using ktwfmscriptcompiler::MarkerModifier;
using ktwfmscriptcompiler::RepeatInstruction;
using ktwfmscriptcompiler::RepeatType;
using ktwfmscriptcompiler::SubsetModifier;
using ktwfmscriptcompiler::WaitInstruction;

// The modifiers of one instruction as the compiler's tree has them, which borrows from here.
struct Markers {
  std::deque<std::vector<std::uint32_t>> positions;
  std::deque<MarkerModifier> modifiers;

  void add(std::uint32_t marker, std::vector<std::uint32_t> at) {
    positions.push_back(std::move(at));
    modifiers.emplace_back();
    modifiers.back().markerNumber = marker;
    modifiers.back().positions = positions.back();
  }
};

}  // namespace

RuleChecker::RuleChecker(const SyntaxTree& tree, const ktwfmscriptcompiler::ScriptTraits& traits)
    : tree_(tree),
      traits_(traits),
      vocabulary_(traits),
      validator_(traits),
      fetchTranslator_(validator_),
      translator_(traits, nesting_, fetchTranslator_, validator_) {}

std::vector<RuleFault> RuleChecker::check(std::uint32_t scriptNode, std::size_t most) {
  script_ = scriptNode;
  most_ = most;
  faults_.clear();
  loops_.clear();
  const SyntaxNode& script = at(scriptNode);
  const auto fault = std::ranges::lower_bound(tree_.faults(), script.firstToken, {}, &SyntaxFault::token);
  const bool isInside = fault != tree_.faults().end() && fault->token <= script.endToken;
  firstToken_ = isInside ? fault->token : script.firstToken;
  wideLoop_ = findScriptWideLoop();
  if (wideLoop_ == kNoIndex) checkPlaysSamples(scriptNode);
  for (std::uint32_t node = scriptNode + 1; node < script.endNode && faults_.size() < most_; ++node) {
    for (; !loops_.empty() && at(loops_.back().node).endNode <= node; loops_.pop_back()) leaveLoop(loops_.back());
    checkInstruction(node);
  }
  for (; !loops_.empty() && faults_.size() < most_; loops_.pop_back()) leaveLoop(loops_.back());
  return std::move(faults_);
}

// Runs a check of the compiler; what it raises is noted for the token.
template <typename Check>
bool RuleChecker::passes(std::uint32_t token, Check check, std::uint32_t opener) {
  if (token < firstToken_) return true;
  try {
    check();
    return true;
  } catch (const kterr::Exception& failure) {
    faults_.push_back({token, opener, failure.code(), readElaboration(failure.getJson())});
    return false;
  }
}

void RuleChecker::checkInstruction(std::uint32_t node) {
  if (at(node).kind == NodeKind::kRepeat) return enterLoop(node);
  if (hasFault(node)) return;
  if (at(node).kind == NodeKind::kGenerate) checkGenerate(node);
  if (at(node).kind == NodeKind::kWait) checkWait(node);
}

void RuleChecker::checkGenerate(std::uint32_t node) {
  GenerateInstruction generate;
  SubsetModifier subset;
  Markers markers;
  for (std::uint32_t child = node + 1; child < at(node).endNode; ++child) {
    std::vector<std::uint32_t> numbers = numbersOf(child);
    if (at(child).kind == NodeKind::kSubset) {
      subset.startOffset = numbers.at(0);
      subset.length = numbers.at(1);
      generate.subset = &subset;
    } else {
      markers.add(vocabulary_.find(tree_.textOf(at(child).firstToken)).value, std::move(numbers));
    }
  }
  for (MarkerModifier& modifier : markers.modifiers) generate.markers.append(modifier);
  ktwfmscriptcompiler::SequenceBlock block;
  passes(at(node).firstToken, [&] { translator_.translateGenerate(generate, block); });
}

void RuleChecker::checkWait(std::uint32_t node) {
  WaitInstruction wait;
  Markers markers;
  for (std::uint32_t child = node + 1; child < at(node).endNode; ++child) {
    markers.add(vocabulary_.find(tree_.textOf(at(child).firstToken)).value, numbersOf(child));
  }
  for (MarkerModifier& modifier : markers.modifiers) wait.markers.append(modifier);
  const std::uint32_t argument = at(node).firstToken + 1;
  const bool isUntil = typeOf(argument) == TokenType::kUntil;
  wait.sampleCount = tree_.valueOf(argument);
  ktwfmscriptcompiler::SequenceBlock block;
  passes(at(node).firstToken,
         [&] { isUntil ? translator_.translateWaitUntil(wait, block) : translator_.translateWait(wait, block); });
}

// Of the loops inside each other that are too many, the outermost is to blame.
void RuleChecker::enterLoop(std::uint32_t node) {
  const std::uint32_t keyword = at(node).firstToken;
  RepeatInstruction repeat;
  repeat.repeatType = typeOf(keyword + 1) == TokenType::kInteger ? RepeatType::kCounted : RepeatType::kForever;
  repeat.iterationCount = tree_.valueOf(keyword + 1);
  const bool isWide = node == wideLoop_;
  const auto outer = std::ranges::find_if(loops_, [this](const OpenLoop& loop) { return loop.node != wideLoop_; });
  const bool isNested = !isWide && outer != loops_.end();
  // A loop with a fault of its own may be meant otherwise.
  const bool isKnown =
      std::ranges::any_of(loops_, [this](const OpenLoop& loop) { return loop.isTooDeep || at(loop.node).hasFault; });
  const bool counts = isWide || at(node).hasFault || passes(keyword, [&] { validator_.checkLoopIterations(repeat); });
  if (counts && isNested && !isKnown) {
    passes(
        keyword,
        [&] {
          ktwfmscriptcompiler::InstructionContainerNestingPolicies nesting;
          nesting.enterRepeatLoop(repeat);
          nesting.enterRepeatLoop(repeat);
        },
        at(outer->node).firstToken);
  } else if (counts) {
    checkPlaysSamples(node);
  }
  loops_.push_back({node, isNested});
}

void RuleChecker::leaveLoop(const OpenLoop& loop) {
  std::uint32_t last = kNoIndex;
  for (std::uint32_t child = loop.node + 1; child < at(loop.node).endNode; child = at(child).endNode) last = child;
  if (last == kNoIndex || at(last).kind != NodeKind::kClear || at(last).hasFault) return;
  RepeatInstruction repeat;
  ktwfmscriptcompiler::ClearInstruction clear;
  repeat.instructions.append(clear);
  passes(at(last).firstToken, [&] { validator_.checkClearNotLastInLoop(repeat, 1); });
}

void RuleChecker::checkPlaysSamples(std::uint32_t container) {
  if (at(container).hasFault) return;
  for (std::uint32_t child = container + 1; child < at(container).endNode; child = at(child).endNode) {
    if (playsSamples(child)) return;
  }
  const ktwfmscriptcompiler::NamedProcedure empty;
  passes(at(container).firstToken, [&] { validator_.checkContainerGeneratesSamples(empty, nesting_); });
}

bool RuleChecker::hasFault(std::uint32_t node) const {
  const auto first = tree_.nodes().begin() + node;
  return std::any_of(first, tree_.nodes().begin() + at(node).endNode,
                     [](const SyntaxNode& own) { return own.hasFault; });
}

bool RuleChecker::playsSamples(std::uint32_t node) const {
  if (at(node).kind != NodeKind::kWait) return at(node).kind != NodeKind::kClear;
  return typeOf(at(node).firstToken + 1) != TokenType::kUntil;
}

// The repeat forever that is the whole body of the script, what had to be skipped aside; kNoIndex where there is none.
std::uint32_t RuleChecker::findScriptWideLoop() const {
  std::uint32_t loop = kNoIndex;
  for (std::uint32_t child = script_ + 1; child < at(script_).endNode; child = at(child).endNode) {
    if (at(child).kind == NodeKind::kSkipped) continue;
    if (loop != kNoIndex || at(child).kind != NodeKind::kRepeat) return kNoIndex;
    loop = child;
  }
  return loop != kNoIndex && typeOf(at(loop).firstToken + 1) == TokenType::kForever ? loop : kNoIndex;
}

std::vector<std::uint32_t> RuleChecker::numbersOf(std::uint32_t node) const {
  std::vector<std::uint32_t> numbers;
  for (std::uint32_t token = at(node).firstToken; token < at(node).endToken; ++token) {
    if (typeOf(token) == TokenType::kInteger) numbers.push_back(tree_.valueOf(token));
  }
  return numbers;
}

}  // namespace tools
