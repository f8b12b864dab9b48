#include "tools/difference/PlayCursor.h"

namespace tools {

using ktorba::LoopKind;

TriggerUse PlayCursor::triggerUse() const {
  TriggerUse use;
  if (offset_ != 0) return use;
  use.cleared = step().clearFlag;
  use.awaited = step().trigger;
  if (spot_ != play_.startOf(spot_.block)) return use;
  const bool isRestart = round_ > 0 && spot_.block == StraightPlay::kFirstOfRound;
  if (spot_.block > 0)
    use.loopEnded = isRestart ? play_.blocks().back().trigger : play_.blocks()[spot_.block - 1].trigger;
  const Block& block = play_.blockOf(spot_);
  use.loopBegun = block.trigger;
  // Without passes that ask, entering a loop is no more than its first step.
  (block.kind == LoopKind::kUntilTrigger ? use.clearedAtEntry : use.cleared) |= block.clearFlag;
  return use;
}

std::array<PlayCursor::Region, 3> PlayCursor::regions() const { return {scriptRegion(), loopRegion(), heldRegion()}; }

PlayCursor::Region PlayCursor::heldRegion() const {
  const bool firesLater = step().markerMask != 0 && offset_ <= step().markerOffset;
  if (step().kind == StepKind::kWaveform || firesLater || offset_ == 0) return {};
  return {Region::Kind::kHeld, 1, left(), false};
}

// From the second pass on: the first holds other levels as it begins.
PlayCursor::Region PlayCursor::loopRegion() const {
  const Block& block = play_.blockOf(spot_);
  if (spot_.pass == 0 || block.kind == LoopKind::kUntilTrigger || block.bodySamples == kBeyond) return {};
  if (loops()) return {Region::Kind::kLoop, block.bodySamples, kBeyond, true};
  const std::uint64_t extent = extentProduct(block.passes - spot_.pass, block.bodySamples);
  return {Region::Kind::kLoop, block.bodySamples, extent == kBeyond ? kBeyond : extent - inBody(), false};
}

PlayCursor::Region PlayCursor::scriptRegion() const {
  if (round_ == 0 || play_.sampleCount() == kBeyond) return {};
  return {Region::Kind::kScript, roundSamples(), kBeyond, true};
}

void PlayCursor::advance(std::uint64_t samples) {
  offset_ += samples;
  if (offset_ == step().sampleCount) beginNextStep();
}

void PlayCursor::beginNextStep() {
  offset_ = 0;
  const Block& block = play_.blockOf(spot_);
  const bool isLastStep = spot_.step + 1 == block.endStep;
  if (isLastStep && loops()) {
    spot_ = {spot_.block, spot_.pass + 1, block.firstStep};
    return;
  }
  spot_ = play_.after(spot_);
  if (spot_.step != play_.blockOf(spot_).endStep) return;
  isOver_ = !play_.isEndless();
  if (isOver_) {
    --spot_.step;
    return;
  }
  spot_ = play_.startOf(StraightPlay::kFirstOfRound);
  ++round_;
}

void PlayCursor::leap(Region::Kind kind, std::uint64_t samples) {
  if (samples == 0) return;
  // To the sample before, and a step from there, which may leave the region.
  const std::uint64_t leap = samples - 1;
  if (kind == Region::Kind::kHeld) {
    offset_ += leap;
  } else if (kind == Region::Kind::kLoop) {
    const Block& block = play_.blockOf(spot_);
    const std::uint64_t target = inBody() + leap;
    const Spot inFirstPass = play_.spotAt(block.start + target % block.bodySamples);
    offset_ = target % block.bodySamples - play_.steps()[inFirstPass.step].startInBody;
    spot_ = {spot_.block, spot_.pass + target / block.bodySamples, inFirstPass.step};
  } else {
    const std::uint64_t target = play_.positionOf(spot_) + offset_ - play_.roundStart() + leap % roundSamples();
    spot_ = play_.spotAt(play_.roundStart() + target % roundSamples());
    offset_ = play_.roundStart() + target % roundSamples() - play_.positionOf(spot_);
  }
  advance(1);
}

}  // namespace tools
