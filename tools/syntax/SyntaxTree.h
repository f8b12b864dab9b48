// A lossless tree of a script text, of a faulty one as well: tokens, nodes over them, and the faults of words and
// grammar. Every byte is in it: what lies between tokens is blanks and comments, and what the compiler does not read
// lies behind unreadFrom(). There are no faults exactly if the compiler accepts words and grammar, and the first one is
// the compiler's, at its place with its code.
//
// Flat: nodes stand in an array in the order of the text, each with where its descendants end, so that building,
// walking and freeing take no stack however deep loops nest. Time and memory are linear. Constant once built.
#pragma once

#include <cstdint>
#include <string_view>
#include <vector>

#include "ktWfmScriptCompiler/ScriptTraits.h"
#include "kterr/ErrorConstant.h"
#include "tools/syntax/SyntaxToken.h"

namespace tools {

inline constexpr std::uint32_t kNoIndex = 0xFFFFFFFF;

enum class NodeKind : std::uint8_t {
  kScript,
  kGenerate,
  kWait,
  kRepeat,
  kClear,
  kSubset,
  kMarker,
  kSkipped  // tokens that nothing could be made of
};

// A run of tokens; its descendants are the nodes behind it up to `endNode`. The first token is its keyword.
struct SyntaxNode {
  std::uint32_t firstToken = 0;
  std::uint32_t endToken = 0;
  std::uint32_t endNode = 0;
  NodeKind kind = NodeKind::kSkipped;
  bool hasFault = false;  // in itself, not in its descendants
};

enum class FaultKind : std::uint8_t {
  kToken,                // the token's own fault
  kEmptyText,            //
  kScriptExpected,       // where a script begins
  kNameExpected,         // of a script or a waveform
  kNameMisread,          // what must have been meant for a keyword was read as the name of one
  kEndMisread,           // what must have been meant for a loop's beginning was read behind "end"
  kInstructionExpected,  // as the first one of a script or loop, and for words that are reserved
  kEndExpected,          // or another instruction, or more of the one before
  kEndOfWhat,            // what stands behind "end" is not what ends here
  kMarkExpected,         // a parenthesis or comma
  kNumberExpected,
  kTriggerExpected,
  kWaitArgument,
  kRepeatArgument,
};

// One fault, at a token that is not what it should be, or behind which something is missing.
struct SyntaxFault {
  FaultKind kind = FaultKind::kToken;
  FaultKind wanted = FaultKind::kToken;         // of kToken: what the place asks for
  TokenType expected = TokenType::kIdentifier;  // of kMarkExpected, kEndOfWhat; of kNameExpected: whose name
  NodeKind previous = NodeKind::kSkipped;       // the instruction before, of kEndExpected
  std::uint32_t token = 0;
  std::uint32_t opener = kNoIndex;  // the token that opened what the fault is in: script, repeat, subset, marker
};

class SyntaxTree {
 public:
  static constexpr std::size_t kMostFaults = 1000;  // further ones are not noted

  // `text` must outlive the tree and have less than 4 GiB.
  SyntaxTree(std::string_view text, const ktwfmscriptcompiler::ScriptTraits& traits);

  std::string_view text() const { return text_; }
  // The last one is kEndOfScript, or the first token behind the last script.
  const std::vector<SyntaxToken>& tokens() const { return tokens_; }
  const std::vector<SyntaxNode>& nodes() const { return nodes_; }
  const std::vector<SyntaxFault>& faults() const { return faults_; }
  // Where the compiler stops reading; the text's size when it reads all of it.
  std::size_t unreadFrom() const { return unreadFrom_; }

  std::string_view textOf(std::uint32_t token) const;
  // The number that an integer token writes, without a fault; 0 of others.
  std::uint32_t valueOf(std::uint32_t token) const;
  // The offset at which the compiler reports the fault.
  std::size_t offsetOf(const SyntaxFault& fault) const;
  const kterr::ErrorConstant& constantOf(const SyntaxFault& fault) const;

 private:
  friend class TreeBuilder;

  std::string_view text_;
  std::vector<SyntaxToken> tokens_;
  std::vector<SyntaxNode> nodes_;
  std::vector<SyntaxFault> faults_;
  std::size_t unreadFrom_ = 0;
};

// The words that could have been meant where the fault is, as scripts write them; empty where none could.
std::vector<std::string> candidatesAt(const SyntaxFault& fault, const ktwfmscriptcompiler::ScriptTraits& traits);

}  // namespace tools
