// Characters that look like others, or like nothing, and are letters to a script.
#pragma once

#include <optional>
#include <span>
#include <string>
#include <string_view>

namespace tools {

struct Lookalike {
  char32_t codePoint;
  std::string_view name;
  std::string_view replacement;  // what to type; empty: nothing
};

struct FoundLookalike {
  std::size_t offset = 0;  // bytes
  std::size_t length = 0;
  const Lookalike* lookalike = nullptr;
};

// In the order of their code points.
std::span<const Lookalike> allLookalikes();

// What to do about it: "Type a blank instead."
std::string adviceOn(const Lookalike& lookalike);

// The first one in `text` from `from` on.
std::optional<FoundLookalike> findLookalike(std::string_view text, std::size_t from = 0);

}  // namespace tools
