#include "simulator/Sequencer.h"

#include <algorithm>
#include <cstring>

#include "ktorba/script/instructionDecoder.h"

namespace simulator {
namespace {

using ktorba::LoopKind;

// Instructions in a row that emit nothing, before the sequencer is taken to be caught in a circle.
constexpr int kMostBarrenInstructions = 65536;
// A wait for a trigger that nobody has scheduled is begun as this many samples at once.
constexpr std::uint64_t kLongWait = std::uint64_t{1} << 62;
constexpr std::uint64_t kBlockSamples = 1024;
// From a sample that is emitted to those whose memory is called into the cache meanwhile.
constexpr std::uint64_t kSamplesAhead = 512;

}  // namespace

Sequencer::Sequencer(const GeneratorParts& parts)
    : parts_(parts), steps_(parts.geometry.sequenceWords * sizeof(Step)) {}

void Sequencer::initiate() {
  isRunning_ = true;
  isDone_ = hasUnderflow_ = false;
  latches_ = ktorba::clearFlagOf(ktorba::kStartTrigger);
  position_ = samplesLeft_ = 0;
  address_ = next_ = held_ = 0;
  lastFetched_ = kNone;
  step_ = {};
  loopDepth_ = 0;
  trace_.clear();
  parts_.streaming.beginGeneration();
  ++parts_.counters.initiates;
}

void Sequencer::reset() {
  isRunning_ = isDone_ = hasUnderflow_ = false;
  latches_ = 0;
  scheduled_.clear();
  nextDue_ = UINT64_MAX;
}

void Sequencer::rewritten(std::uint64_t firstAddress, std::uint64_t lastAddress) {
  Step* const steps = reinterpret_cast<Step*>(steps_.data());
  for (std::uint64_t address = firstAddress; address <= lastAddress; ++address) {
    if (steps[address].kind != StepKind::kUnread) steps[address].kind = StepKind::kUnread;
  }
}

const Step& Sequencer::stepAt(std::uint32_t address) {
  Step& step = reinterpret_cast<Step*>(steps_.data())[address];
  if (step.kind == StepKind::kUnread) step = readStep(parts_.sequenceMemory[address], address, parts_.geometry);
  return step;
}

// ---- Triggers ----

void Sequencer::raise(std::uint32_t trigger) {
  latches_ |= ktorba::clearFlagOf(trigger);
  if (isWaitingForTrigger()) samplesLeft_ %= step_.sampleCount;
}

bool Sequencer::raiseAt(std::uint32_t trigger, std::uint64_t sample) {
  if (isRunning_ && sample <= position_) {
    raise(trigger);
    return true;
  }
  if (scheduled_.size() == kMostScheduled) return false;
  const auto later = std::ranges::upper_bound(scheduled_, sample, {}, &Scheduled::sample);
  scheduled_.insert(later, {sample, trigger});
  nextDue_ = scheduled_.front().sample;
  if (isWaitingForTrigger()) samplesLeft_ %= step_.sampleCount;
  return true;
}

void Sequencer::latchDue() {
  const auto later = std::ranges::upper_bound(scheduled_, position_, {}, &Scheduled::sample);
  for (auto due = scheduled_.begin(); due != later; ++due) {
    latches_ |= ktorba::clearFlagOf(due->trigger);
  }
  scheduled_.erase(scheduled_.begin(), later);
  nextDue_ = scheduled_.empty() ? UINT64_MAX : scheduled_.front().sample;
}

// ---- Playing ----

std::uint64_t Sequencer::play(std::uint64_t count, Output& output) {
  const bool wasRunning = isRunning_;
  std::uint64_t missing = count;
  while (missing != 0 && isRunning_) {
    const OutputWindow window = output.open(position_, missing);
    const std::uint64_t filled = fill(window, std::min(window.room, missing));
    output.commit(filled);
    missing -= filled;
  }
  if (wasRunning && nextDue_ <= position_) latchDue();
  holdLastFetched();
  parts_.counters.samplesPlayed += count - missing;
  return count - missing;
}

// In blocks whose markers stay in the first cache between being cleared and being set.
std::uint64_t Sequencer::fill(const OutputWindow& window, std::uint64_t count) {
  const std::uint64_t blockSamples = window.isWanted() ? kBlockSamples : count;
  std::uint64_t filled = 0;
  while (filled < count && isRunning_) {
    filled += fillBlock(window.behind(filled, parts_.geometry.bytesPerSample), std::min(count - filled, blockSamples));
  }
  return filled;
}

std::uint64_t Sequencer::fillBlock(const OutputWindow& block, std::uint64_t count) {
  if (block.markers != nullptr) std::memset(block.markers, 0, count);
  const std::uint32_t width = parts_.geometry.bytesPerSample;
  OutputWindow rest = block;
  std::uint64_t left = count;
  while (left != 0 && isRunning_ && (samplesLeft_ != 0 || beginSamples())) {
    const std::uint64_t run = std::min(samplesLeft_, left);
    rest.prefetch(kSamplesAhead, run, width);
    emit(rest.samples, rest.markers, run);
    rest = rest.behind(run, width);
    left -= run;
  }
  return count - left;
}

// Executes up to the next instruction that emits samples; false when the sequencer has stopped.
bool Sequencer::beginSamples() {
  if (nextDue_ <= position_) latchDue();
  if (isWaitingForTrigger() && !isLatched(step_.trigger)) {
    beginNextPass();
    return true;
  }
  for (int barren = 0; barren < kMostBarrenInstructions; ++barren) {
    execute();
    if (!isRunning_ || samplesLeft_ != 0) return isRunning_;
  }
  fail(KTSIM_F_NO_SAMPLES, "circle of instructions that emit no sample");
  return false;
}

// As many passes as are certain to be played before the next trigger.
void Sequencer::beginNextPass() {
  const std::uint64_t wait = nextDue_ == UINT64_MAX ? kLongWait : std::min(nextDue_ - position_, kLongWait);
  const std::uint64_t passes = (wait + step_.sampleCount - 1) / step_.sampleCount;
  samplesLeft_ = passes * step_.sampleCount;
}

void Sequencer::execute() {
  address_ = next_;
  if (address_ >= parts_.geometry.sequenceWords) return fail(KTSIM_F_INSTRUCTION, "ran off the end of sequence memory");
  const Step& step = stepAt(address_);
  if (trace_.capacity() != 0) trace(parts_.sequenceMemory[address_]);
  ++parts_.counters.instructionsExecuted;
  next_ = address_ + 1;
  switch (step.kind) {
    case StepKind::kFetch:
    case StepKind::kWait:
    case StepKind::kScriptEnd:
      return beginEmission(step);
    case StepKind::kLoopStart:
      return enterLoop(step);
    case StepKind::kLoopEnd:
      return endLoop(step);
    case StepKind::kJump:
      next_ = step.target;
      return;
    case StepKind::kUnread:
    case StepKind::kMalformed:
      return fail(KTSIM_F_INSTRUCTION, findFlaw(parts_.sequenceMemory[address_], address_, parts_.geometry));
  }
}

void Sequencer::beginEmission(const Step& step) {
  if (step.kind != StepKind::kFetch) holdLastFetched();
  step_ = step;
  samplesLeft_ = step.sampleCount;
  nextSample_ = step.firstSample;
  latches_ = static_cast<std::uint8_t>(latches_ & ~step.clearFlag);
}

// A loop that is entered while it is open was left by a jump; it and those inside it begin anew.
void Sequencer::enterLoop(const Step& step) {
  const auto open = loops_.begin() + static_cast<std::ptrdiff_t>(loopDepth_);
  const auto same =
      std::find_if(loops_.begin(), open, [&](const Loop& loop) { return loop.bodyAddress == step.target; });
  if (same == loops_.end()) return fail(KTSIM_F_INSTRUCTION, "more than 16 loops open");
  *same = {step.target, 0, parts_.sequenceMemory[address_]};
  loopDepth_ = static_cast<std::size_t>(same - loops_.begin()) + 1;
  latches_ = static_cast<std::uint8_t>(latches_ & ~step.clearFlag);
}

void Sequencer::endLoop(const Step& step) {
  while (loopDepth_ != 0 && loops_[loopDepth_ - 1].bodyAddress != step.target) --loopDepth_;
  if (loopDepth_ == 0) return fail(KTSIM_F_INSTRUCTION, "loop end without its loop start");
  Loop& loop = loops_[loopDepth_ - 1];
  const auto& words = parts_.sequenceMemory[address_].words;
  if (!std::equal(words.begin(), words.begin() + 3, loop.words.words.begin())) {
    return fail(KTSIM_F_INSTRUCTION, "loop end differs from its loop start");
  }
  const bool isOver = step.loopKind == LoopKind::kCounted        ? loop.pass + 1 >= step.iterationCount
                      : step.loopKind == LoopKind::kUntilTrigger ? isLatched(step.trigger)
                                                                 : false;
  if (isOver) {
    --loopDepth_;
  } else {
    ++loop.pass;
    next_ = step.target;
  }
}

void Sequencer::fail(std::int32_t code, const char* reason) {
  isRunning_ = false;
  samplesLeft_ = 0;
  const bool isInside = address_ < parts_.geometry.sequenceWords;
  parts_.faults.record(code, address_, position_, "instruction %u: %s (%s)", static_cast<unsigned>(address_), reason,
                       isInside ? ktorba::describeInstruction(parts_.sequenceMemory[address_]).c_str() : "none there");
}

// ---- Emission ----

void Sequencer::emit(std::byte* samples, std::uint8_t* markers, std::uint64_t count) {
  if (step_.markerMask != 0) emitMarker(markers, count);
  if (step_.kind == StepKind::kFetch) {
    emitFetched(samples, count);
  } else if (samples != nullptr) {
    emitHeld(samples, count);
  }
  position_ += count;
  samplesLeft_ -= count;
  if (samplesLeft_ == 0 && step_.kind == StepKind::kScriptEnd) {
    isRunning_ = false;
    isDone_ = true;
  }
}

void Sequencer::emitFetched(std::byte* samples, std::uint64_t count) {
  const std::uint32_t width = parts_.geometry.bytesPerSample;
  if (samples != nullptr) std::memcpy(samples, parts_.sampleMemory + nextSample_ * width, count * width);
  if (parts_.streaming.isLoaded() && !parts_.streaming.played(nextSample_, count)) hasUnderflow_ = true;
  nextSample_ += count;
  lastFetched_ = nextSample_ - 1;
}

void Sequencer::holdLastFetched() {
  if (lastFetched_ == kNone) return;
  const std::uint32_t width = parts_.geometry.bytesPerSample;
  held_ = 0;
  std::memcpy(&held_, parts_.sampleMemory + lastFetched_ * width, width);
  lastFetched_ = kNone;
}

void Sequencer::emitHeld(std::byte* samples, std::uint64_t count) const {
  if (parts_.geometry.bytesPerSample == 2) {
    std::fill_n(reinterpret_cast<std::uint16_t*>(samples), count, static_cast<std::uint16_t>(held_));
  } else {
    std::fill_n(reinterpret_cast<std::uint32_t*>(samples), count, held_);
  }
}

void Sequencer::emitMarker(std::uint8_t* markers, std::uint64_t count) {
  const std::uint64_t played = step_.sampleCount - samplesLeft_;
  if (step_.markerOffset < played || step_.markerOffset >= played + count) return;
  parts_.counters.markersFired += step_.markerCount;
  if (markers != nullptr) markers[step_.markerOffset - played] = step_.markerMask;
}

// ---- What is seen from outside ----

void Sequencer::trace(const SequenceInstructionWords& words) {
  if (trace_.room() == 0) {
    ++parts_.counters.traceEntriesLost;
    return;
  }
  ktSim_TraceEntry entry{position_, address_, {}, loopDepth_ == 0 ? 0 : loops_[loopDepth_ - 1].pass};
  std::ranges::copy(words.words, entry.words);
  trace_.push(&entry, 1);
}

void Sequencer::describe(ktSim_State& state) const {
  state.running = isRunning_;
  state.done = isDone_;
  state.underflow = hasUnderflow_;
  state.triggerLatches = latches_;
  state.waitingForTrigger = isRunning_ && isWaitingForTrigger() ? step_.trigger : std::uint8_t{0};
  state.address = address_;
  state.loopDepth = static_cast<std::uint32_t>(loopDepth_);
  state.lastSample = held_;
  state.samplesPlayed = position_;
}

}  // namespace simulator
