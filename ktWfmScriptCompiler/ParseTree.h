// The tree that the parser builds and that the validator and the translators walk.
//
// Nodes live in an arena of the root, a ProcedureCollection: create them there and never delete one. Deleting the
// root, through iParseTree or not, frees the whole tree in one step however deep it is; no node has a destructor
// that has work to do. The tree is complete in itself: it refers to neither lexer nor text.
// A tree may be read by any number of threads, and built by one.
#pragma once

#include <cstddef>
#include <cstdint>
#include <iterator>
#include <new>
#include <span>
#include <string_view>
#include <typeinfo>

#include "ktWfmScriptCompiler/Arena.h"
#include "ktWfmScriptCompiler/Token.h"

namespace ktwfmscriptcompiler {

// A sequence of nodes, threaded through their `next`.
template <typename Node>
class NodeList {
 public:
  class const_iterator {
   public:
    using iterator_category = std::forward_iterator_tag;
    using value_type = Node;
    using difference_type = std::ptrdiff_t;
    using pointer = const Node*;
    using reference = const Node&;

    const_iterator() = default;
    explicit const_iterator(const Node* node) : node_(node) {}
    reference operator*() const { return *node_; }
    pointer operator->() const { return node_; }
    const_iterator& operator++() {
      node_ = node_->next;
      return *this;
    }
    const_iterator operator++(int) {
      const const_iterator old = *this;
      ++*this;
      return old;
    }
    bool operator==(const const_iterator&) const = default;

   private:
    const Node* node_ = nullptr;
  };

  const_iterator begin() const { return const_iterator(first_); }
  const_iterator end() const { return {}; }
  bool empty() const { return first_ == nullptr; }
  const Node& front() const { return *first_; }  // not of an empty list, as back()
  const Node& back() const { return *last_; }

  // Appends a node that is in no list yet.
  void append(Node& node) {
    (first_ == nullptr ? first_ : last_->next) = &node;
    last_ = &node;
  }

 private:
  Node* first_ = nullptr;
  Node* last_ = nullptr;
};

class iParseTree {
 public:
  virtual ~iParseTree() = default;

  SourcePosition position() const { return {lineNumber, positionInLine}; }
  SourcePlace place() const { return {position()}; }

  std::uint32_t lineNumber = 0;      // of the node's first token
  std::uint32_t positionInLine = 0;  // of the node's first token, bytes from 1

 protected:
  iParseTree() = default;
  iParseTree(const iParseTree&) = delete;
  iParseTree& operator=(const iParseTree&) = delete;
};

struct Instruction : virtual iParseTree {
  TokenType type = TokenType::kIdentifier;  // of the instruction's keyword
  Instruction* next = nullptr;              // in its container
};

struct InstructionContainer : virtual iParseTree {
  NodeList<Instruction> instructions;
};

struct NamedProcedure final : virtual InstructionContainer {
  std::string_view name;  // as written
  NamedProcedure* next = nullptr;
};

struct MarkerModifier final : virtual iParseTree {
  std::uint32_t markerNumber = 0;
  std::span<const std::uint32_t> positions;  // samples, in the order written
  MarkerModifier* next = nullptr;
};

struct SubsetModifier final : virtual iParseTree {
  std::uint32_t startOffset = 0;  // samples
  std::uint32_t length = 0;       // samples
};

struct FetchInstruction : virtual Instruction {
  NodeList<MarkerModifier> markers;
};

struct GenerateInstruction final : FetchInstruction {
  GenerateInstruction() { type = TokenType::kGenerate; }

  std::string_view waveformName;
  const SubsetModifier* subset = nullptr;  // null: the whole waveform
};

enum class WaitType : std::uint32_t { kCounted = 0, kUntilTrigger = 1 };

struct WaitInstruction final : FetchInstruction {
  WaitInstruction() { type = TokenType::kWait; }

  WaitType waitType = WaitType::kCounted;
  std::uint32_t trigger = 0;      // table number, of until-waits
  std::uint32_t sampleCount = 0;  // of counted waits
};

enum class RepeatType : std::uint32_t { kCounted = 1, kForever = 2, kUntilTrigger = 3 };

struct RepeatInstruction final : virtual Instruction, virtual InstructionContainer {
  RepeatInstruction() { type = TokenType::kRepeat; }

  RepeatType repeatType = RepeatType::kCounted;
  std::uint32_t iterationCount = 0;  // of counted loops
  std::uint32_t trigger = 0;         // table number, of until-loops
};

struct ClearInstruction final : virtual Instruction {
  ClearInstruction() { type = TokenType::kClear; }

  std::span<const std::uint32_t> triggers;  // table numbers, in the order written
};

// The root, owner of every node below it.
class ProcedureCollection final : public virtual iParseTree {
 public:
  NodeList<NamedProcedure> procedures;

  // Creates a node of this tree, in no list yet.
  template <typename Node>
  Node& create(SourcePosition position) {
    static_assert(alignof(Node) <= Arena::kAlignment);
    Node* node = new (arena_.allocate(sizeof(Node))) Node;
    node->lineNumber = position.line;
    node->positionInLine = position.positionInLine;
    return *node;
  }

  // Copies a text or a sequence of numbers into the tree.
  std::string_view store(std::string_view text) { return arena_.store(text); }
  std::span<const std::uint32_t> store(std::span<const std::uint32_t> numbers) { return arena_.store(numbers); }

 private:
  Arena arena_;
};

[[noreturn]] void raiseWrongNode();

// The node as its concrete class; raises ktmxl::kErrorSoftwareFault when it is of another. The classes are final, so
// comparing type records settles it, where a dynamic_cast to the class would search the virtual bases each time.
template <typename Concrete>
const Concrete& downcast(const iParseTree& node) {
  if (typeid(node) != typeid(Concrete)) raiseWrongNode();
  return *static_cast<const Concrete*>(dynamic_cast<const void*>(&node));
}

// The loop that is the whole body of the procedure and never ends, or null. It repeats the script as a whole.
const RepeatInstruction* scriptWideLoop(const NamedProcedure& procedure);

}  // namespace ktwfmscriptcompiler
