// Where a script uses one trigger: which steps and loops clear it, and which wait or loop until it. Finds the next use
// from anywhere in logarithmic time. Constant once made; any thread may read. The straight play must outlive it.
#pragma once

#include <cstdint>
#include <optional>
#include <vector>

#include "tools/timeline/StraightPlay.h"

namespace tools {

class TriggerUses {
 public:
  TriggerUses(const StraightPlay& play, std::uint8_t hardwareTrigger);

  // The first spot from there on, it included, where the trigger is cleared: as the step begins.
  std::optional<Spot> nextClear(const Spot& from) const;

  // The first step or loop from there on, it included, that asks for the trigger as it ends. A loop's is the spot at
  // the end of its body.
  std::optional<Spot> nextQuestion(const Spot& from) const;

 private:
  // Steps and the blocks that they, or the loop itself, lie in; both ascending.
  struct Uses {
    std::vector<std::uint32_t> steps;
    std::vector<std::uint32_t> blocks;
  };
  // The first of the steps from `from` on that lies in the block.
  static std::optional<std::uint32_t> findStep(const Uses& uses, std::uint32_t from, const Block& block);
  // The next use among the steps of the block that the spot lies in, or of its further passes.
  std::optional<Spot> findInBlock(const Uses& uses, const Spot& from) const;
  static std::optional<std::uint32_t> findBlock(const Uses& uses, std::uint32_t from);
  bool isClearedBy(std::uint32_t block) const;
  bool isAskedBy(std::uint32_t block) const;

  const StraightPlay& play_;
  std::uint8_t trigger_;
  Uses clears_;
  Uses questions_;
};

}  // namespace tools
