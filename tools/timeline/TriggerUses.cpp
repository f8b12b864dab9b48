#include "tools/timeline/TriggerUses.h"

#include <algorithm>

namespace tools {

TriggerUses::TriggerUses(const StraightPlay& play, std::uint8_t hardwareTrigger)
    : play_(play), trigger_(hardwareTrigger) {
  const std::uint8_t bit = ktorba::clearFlagOf(trigger_);
  for (std::uint32_t block = 0; block < play.blocks().size(); ++block) {
    const std::size_t clears = clears_.steps.size();
    const std::size_t questions = questions_.steps.size();
    for (std::uint32_t step = play.blocks()[block].firstStep; step < play.blocks()[block].endStep; ++step) {
      if ((play.steps()[step].clearFlag & bit) != 0) clears_.steps.push_back(step);
      if (play.steps()[step].trigger == trigger_) questions_.steps.push_back(step);
    }
    if (clears_.steps.size() > clears || isClearedBy(block)) clears_.blocks.push_back(block);
    if (questions_.steps.size() > questions || isAskedBy(block)) questions_.blocks.push_back(block);
  }
}

bool TriggerUses::isClearedBy(std::uint32_t block) const {
  return (play_.blocks()[block].clearFlag & ktorba::clearFlagOf(trigger_)) != 0;
}

bool TriggerUses::isAskedBy(std::uint32_t block) const { return play_.blocks()[block].trigger == trigger_; }

std::optional<std::uint32_t> TriggerUses::findStep(const Uses& uses, std::uint32_t from, const Block& block) {
  const auto step = std::ranges::lower_bound(uses.steps, from);
  return step != uses.steps.end() && *step < block.endStep ? std::optional(*step) : std::nullopt;
}

std::optional<std::uint32_t> TriggerUses::findBlock(const Uses& uses, std::uint32_t from) {
  const auto block = std::ranges::lower_bound(uses.blocks, from);
  return block != uses.blocks.end() ? std::optional(*block) : std::nullopt;
}

std::optional<Spot> TriggerUses::findInBlock(const Uses& uses, const Spot& from) const {
  const Block& block = play_.blockOf(from);
  if (const auto step = findStep(uses, from.step, block)) return Spot{from.block, from.pass, *step};
  if (!block.isCounted() || from.pass + 1 >= block.passes) return std::nullopt;
  if (const auto step = findStep(uses, block.firstStep, block)) return Spot{from.block, from.pass + 1, *step};
  return std::nullopt;
}

std::optional<Spot> TriggerUses::nextClear(const Spot& from) const {
  const bool isEntered = from == play_.startOf(from.block);
  if (isEntered && isClearedBy(from.block)) return from;
  if (const auto spot = findInBlock(clears_, from)) return spot;
  const auto block = findBlock(clears_, from.block + 1);
  if (!block) return std::nullopt;
  const Spot start = play_.startOf(*block);
  return isClearedBy(*block) ? start : findInBlock(clears_, start);
}

std::optional<Spot> TriggerUses::nextQuestion(const Spot& from) const {
  if (const auto spot = findInBlock(questions_, from)) return spot;
  if (isAskedBy(from.block)) return Spot{from.block, from.pass, play_.blockOf(from).endStep};
  const auto block = findBlock(questions_, from.block + 1);
  if (!block) return std::nullopt;
  const Spot start = play_.startOf(*block);
  if (const auto spot = findInBlock(questions_, start)) return spot;
  return Spot{*block, 0, play_.blocks()[*block].endStep};
}

}  // namespace tools
