// The framework's view of one FPGA: numbered contexts, each with a type and a list of children. Lists may name a
// context twice or close a circle; nothing here follows them. Guarded by its FPGA's lock.
#pragma once

#include <cstdint>
#include <optional>
#include <vector>

namespace simulator {

// Where a context's registers are: one subsystem per generator, each with a base of its own.
struct RegisterBlock {
  std::uint8_t subsystem;
  std::uint64_t baseOffset;
};

struct Context {
  std::uint16_t type = 0;
  std::uint16_t reportedType = 0;
  std::uint16_t versionMajor = 0;
  std::uint16_t versionMinor = 0;
  std::uint8_t instance = 0;
  std::optional<RegisterBlock> registers;
  std::vector<std::uint32_t> children{};
  std::int32_t changeAfterCount = 0;  // children to come, or to go, once they have been counted
};

class ContextTree {
 public:
  ContextTree() : contexts_(1) {}

  Context* find(std::uint32_t number) { return number < contexts_.size() ? &contexts_[number] : nullptr; }
  // The parents must exist.
  std::uint32_t add(std::uint32_t parent, Context context);
  void list(std::uint32_t parent, std::uint32_t child) { contexts_[parent].children.push_back(child); }
  // The first child of a type, and of an instance; null when there is none.
  const std::uint32_t* findChild(std::uint32_t parent, std::uint16_t type, std::uint8_t instance) const;
  // Makes the change that was waiting for this count.
  void changeChildren(std::uint32_t parent);

 private:
  std::vector<Context> contexts_;
};

}  // namespace simulator
