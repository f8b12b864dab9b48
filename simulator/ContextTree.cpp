#include "simulator/ContextTree.h"

#include <algorithm>
#include <utility>

namespace simulator {

std::uint32_t ContextTree::add(std::uint32_t parent, Context context) {
  const auto number = static_cast<std::uint32_t>(contexts_.size());
  contexts_.push_back(std::move(context));
  list(parent, number);
  return number;
}

const std::uint32_t* ContextTree::findChild(std::uint32_t parent, std::uint16_t type, std::uint8_t instance) const {
  const std::vector<std::uint32_t>& children = contexts_[parent].children;
  const auto child = std::ranges::find_if(children, [&](std::uint32_t number) {
    return contexts_[number].type == type && contexts_[number].instance == instance;
  });
  return child == children.end() ? nullptr : &*child;
}

void ContextTree::changeChildren(std::uint32_t parent) {
  std::int32_t change = std::exchange(contexts_[parent].changeAfterCount, 0);
  for (; change > 0; --change) add(parent, {});
  for (; change < 0 && !contexts_[parent].children.empty(); ++change) contexts_[parent].children.pop_back();
}

}  // namespace simulator
