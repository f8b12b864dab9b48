#include "tools/timeline/StraightPlay.h"

#include <algorithm>

#include "ktorba/script/instructionDecoder.h"

namespace tools {
namespace {

namespace fetch_field = ktorba::fetch_field;
namespace loop_field = ktorba::loop_field;
using ktorba::DecodedInstruction;
using ktorba::LoopKind;
using ktorba::Opcode;

LoopKind loopKindOf(const DecodedInstruction& loop) {
  if (loop[loop_field::kIsUntil] != 0) return LoopKind::kUntilTrigger;
  return loop[loop_field::kIsCounted] != 0 ? LoopKind::kCounted : LoopKind::kForever;
}

// A counted loop plays its body once before it counts.
std::uint64_t passesOf(const DecodedInstruction& loop) {
  return loopKindOf(loop) == LoopKind::kCounted ? std::max<std::uint64_t>(loop[loop_field::kIterationCount], 1) : 1;
}

template <typename Number>
Number field(const DecodedInstruction& instruction, const ktorba::InstructionField& which) {
  return static_cast<Number>(instruction[which]);
}

}  // namespace

StraightPlay::StraightPlay(const Program& program, const ProgramBuilder& builder) {
  const auto& words = program.entry.instructionWords;
  steps_.reserve(words.size());
  for (std::size_t address = 0; address < words.size(); ++address) {
    switch (static_cast<Opcode>(ktorba::decodeInstruction(words[address]).opcode)) {
      case Opcode::kLoopStart:
        appendLoop(program, address);
        break;
      case Opcode::kLoopEnd:
        closeBlock();
        break;
      case Opcode::kJump:
        isEndless_ = true;
        break;
      case Opcode::kFetch:
      case Opcode::kScriptEnd:
        appendStep(program, builder, address);
        break;
    }
  }
  indices_.clear();
}

void StraightPlay::appendLoop(const Program& program, std::size_t address) {
  const DecodedInstruction loop = ktorba::decodeInstruction(program.entry.instructionWords[address]);
  Block& block = blocks_.emplace_back();
  block.firstStep = static_cast<std::uint32_t>(steps_.size());
  block.address = static_cast<std::uint32_t>(address);
  block.kind = loopKindOf(loop);
  block.passes = passesOf(loop);
  block.clearFlag = field<std::uint8_t>(loop, loop_field::kClearFlag);
  if (block.kind == LoopKind::kUntilTrigger) block.trigger = field<std::uint8_t>(loop, loop_field::kTriggerNumber);
  isInLoop_ = true;
}

void StraightPlay::appendStep(const Program& program, const ProgramBuilder& builder, std::size_t address) {
  const DecodedInstruction fetch = ktorba::decodeInstruction(program.entry.instructionWords[address]);
  if (!isInLoop_) {
    Block& block = blocks_.emplace_back();
    block.firstStep = static_cast<std::uint32_t>(steps_.size());
    block.address = static_cast<std::uint32_t>(address);
  }
  Block& block = blocks_.back();
  const std::uint64_t perWord = builder.traits().samplesPerMemoryWord;
  Step step;
  step.startInBody = block.bodySamples;
  step.sampleCount =
      fetch[fetch_field::kWordCount] * perWord - fetch[fetch_field::kHeadSkip] - fetch[fetch_field::kTailSkip];
  step.address = static_cast<std::uint32_t>(address);
  step.markerMask = field<std::uint8_t>(fetch, fetch_field::kMarkerMask);
  step.markerOffset = field<std::uint8_t>(fetch, fetch_field::kMarkerOffset);
  step.clearFlag = field<std::uint8_t>(fetch, fetch_field::kClearFlag);
  step.trigger = field<std::uint8_t>(fetch, fetch_field::kTriggerNumber);
  if (fetch[fetch_field::kIsWait] == 0) {
    const std::string name(program.fetchOf(address)->waveformName);
    const ktorba::WaveformEntry& waveform = builder.waveforms().getWaveform(name);
    step.kind = StepKind::kWaveform;
    step.waveform = indexOf(waveform.name);
    step.firstInWaveform = fetch[fetch_field::kFirstWord] * perWord + fetch[fetch_field::kHeadSkip] -
                           waveform.memoryOffset / builder.traits().sampleBytes();
    block.waveformInside = static_cast<std::uint32_t>(steps_.size());
  } else if (step.trigger != 0) {
    step.kind = StepKind::kWaitForTrigger;
  }
  step.lastWaveform = block.waveformInside;
  block.bodySamples = extentSum(block.bodySamples, step.sampleCount);
  steps_.push_back(step);
  if (!isInLoop_) closeBlock();
}

std::uint32_t StraightPlay::indexOf(const std::string& waveform) {
  const auto [entry, isNew] = indices_.emplace(waveform, static_cast<std::uint32_t>(waveforms_.size()));
  if (isNew) waveforms_.push_back(waveform);
  return entry->second;
}

void StraightPlay::closeBlock() {
  Block& block = blocks_.back();
  block.endStep = static_cast<std::uint32_t>(steps_.size());
  block.start = sampleCount_;
  if (blocks_.size() > 1) {
    const Block& last = blocks_[blocks_.size() - 2];
    block.waveformBefore = last.waveformInside != Step::kNone ? last.waveformInside : last.waveformBefore;
  }
  sampleCount_ = extentSum(sampleCount_, block.sampleCount());
  isInLoop_ = false;
}

Spot StraightPlay::spotAt(std::uint64_t sample) const {
  const auto nextBlock = std::ranges::upper_bound(blocks_, sample, {}, &Block::start);
  const auto block = static_cast<std::uint32_t>(nextBlock - blocks_.begin()) - 1;
  const Block& found = blocks_[block];
  const std::uint64_t pass = (sample - found.start) / found.bodySamples;
  const std::uint64_t inBody = (sample - found.start) % found.bodySamples;
  const auto nextStep =
      std::upper_bound(steps_.begin() + found.firstStep, steps_.begin() + found.endStep, inBody,
                       [](std::uint64_t position, const Step& step) { return position < step.startInBody; });
  return {block, pass, static_cast<std::uint32_t>(nextStep - steps_.begin()) - 1};
}

std::uint64_t StraightPlay::positionOf(const Spot& spot) const {
  const Block& block = blockOf(spot);
  const std::uint64_t passes = block.isCounted() ? spot.pass : 0;
  const std::uint64_t inBody = spot.step == block.endStep ? block.bodySamples : steps_[spot.step].startInBody;
  return extentSum(extentSum(block.start, extentProduct(passes, block.bodySamples)), inBody);
}

Spot StraightPlay::after(const Spot& spot) const {
  const Block& block = blockOf(spot);
  if (spot.step + 1 < block.endStep) return {spot.block, spot.pass, spot.step + 1};
  if (block.isCounted() && spot.pass + 1 < block.passes) return {spot.block, spot.pass + 1, block.firstStep};
  if (spot.block + 1 < blocks_.size()) return startOf(spot.block + 1);
  return {spot.block, spot.pass, block.endStep};
}

std::uint32_t StraightPlay::heldStep(const Spot& spot, std::uint64_t round) const {
  const Step& step = steps_[spot.step];
  if (step.lastWaveform != Step::kNone) return step.lastWaveform;
  const Block& block = blockOf(spot);
  if (spot.pass > 0 && block.waveformInside != Step::kNone) return block.waveformInside;
  if (block.waveformBefore != Step::kNone || round == 0) return block.waveformBefore;
  const Block& last = blocks_.back();
  return last.waveformInside != Step::kNone ? last.waveformInside : last.waveformBefore;
}

}  // namespace tools
