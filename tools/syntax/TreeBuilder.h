// Builds a SyntaxTree: the compiler's grammar, with one token of lookahead, that goes on behind a fault. Until the
// first fault it does what the compiler's parser does; a fault is noted once per token, and what stands there is then
// taken for what was most likely meant, given to whom it may belong, or skipped up to the next line or instruction.
// Internal to the tree.
#pragma once

#include <vector>

#include "ktWfmScriptCompiler/Vocabulary.h"
#include "tools/syntax/Scanner.h"
#include "tools/syntax/SyntaxTree.h"

namespace tools {

class TreeBuilder {
 public:
  TreeBuilder(SyntaxTree& tree, const ktwfmscriptcompiler::ScriptTraits& traits);

  void build();

 private:
  // A script or loop whose end has not been read.
  struct Open {
    std::uint32_t node;
    bool isEmpty = true;
    NodeKind previous = NodeKind::kSkipped;  // the instruction read last
  };

  bool beginsScript() const;
  void parseScript();
  void parseBody();
  void parseNext();
  void parseInstruction(TokenType keyword);
  void parseArguments(TokenType keyword, std::uint32_t node);
  void parseUnexpected();
  void parseEnd();
  void parseEndOf();
  void parseWrongEnd(TokenType wanted);
  void parseGenerate();
  void parseWait();
  void parseRepeat();
  void parseClear();
  void parseModifiers(bool mayHaveSubset);
  void parseModifier(NodeKind kind);
  void parseArguments(bool isSubset, std::uint32_t opener);
  bool parseNumber(std::uint32_t opener);
  void parseClosing(std::uint32_t opener);
  void parseName(TokenType owner);
  bool lacksName(TokenType owner) const;
  void parseMisread(TokenType owner, std::uint32_t opener);
  void parseTrigger();

  // The current token.
  const SyntaxToken& current() const { return tree_.tokens_.back(); }
  std::uint32_t index() const { return static_cast<std::uint32_t>(tree_.tokens_.size() - 1); }
  bool at(TokenType type) const { return !isFaulty() && current().type() == type; }
  bool atEnd() const { return current().type() == TokenType::kEndOfScript; }
  bool isFaulty() const { return current().fault() != TokenFault::kNone; }
  bool startsInstruction() const;
  bool isName() const;
  // Whether it may be a mistyped argument: a word on the line of the one before.
  bool isArgument() const;
  SyntaxToken peek() const { return Scanner(scanner_).next(); }
  bool lacksEnds() const;
  void take() { tree_.tokens_.push_back(scanner_.next()); }

  // Notes a fault of the current token; its own fault where it has one. Nothing where it has been noted before.
  SyntaxFault note(FaultKind kind, TokenType expected = TokenType::kIdentifier, std::uint32_t opener = kNoIndex);
  // What the current token was most likely meant to be: one of the words that could stand at the fault.
  TokenType guess(const SyntaxFault& fault) const;
  void skipLine();
  void skipToScript();

  std::uint32_t openNode(NodeKind kind);
  void closeNode(std::uint32_t node);
  void closeInnermost();
  void closeAll();
  std::uint32_t keywordOf(const Open& open) const { return tree_.nodes_[open.node].firstToken; }
  bool isLoop(const Open& open) const { return tree_.nodes_[open.node].kind == NodeKind::kRepeat; }

  SyntaxTree& tree_;
  const ktwfmscriptcompiler::ScriptTraits& traits_;
  ktwfmscriptcompiler::Vocabulary vocabulary_;
  Scanner scanner_;
  std::vector<Open> open_;                // outermost first
  std::uint32_t lastFault_ = kNoIndex;    // the token of the fault noted last
  std::uint32_t instruction_ = kNoIndex;  // the node that faults belong to
};

}  // namespace tools
