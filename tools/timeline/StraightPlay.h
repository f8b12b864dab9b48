// A program laid end to end as if no trigger were ever missing: each block plays its counted passes, each wait for a
// trigger and each loop without a count one pass. What really plays is this straight play with some of its pieces
// repeated (Folding.h), so all that repeats needs to be known once.
//
// Samples are counted from the start of the script; numbers beyond 64 bits are kBeyond. Constant once made; any thread
// may read.
#pragma once

#include <compare>
#include <cstdint>
#include <map>
#include <string>
#include <vector>

#include "conventions/conventions.h"
#include "ktcheckname/compareNames.h"
#include "tools/program/ProgramBuilder.h"
#include "tools/timeline/extent.h"

namespace tools {

enum class StepKind : std::uint8_t { kWaveform, kWait, kWaitForTrigger };

// An instruction that plays samples.
struct Step {
  static constexpr std::uint32_t kNone = UINT32_MAX;

  std::uint64_t startInBody = 0;      // samples from the start of its block's pass
  std::uint64_t sampleCount = 0;      // of one pass of it, at least 1
  std::uint64_t firstInWaveform = 0;  // sample
  std::uint32_t waveform = kNone;     // index into StraightPlay::waveforms()
  std::uint32_t address = 0;
  std::uint32_t lastWaveform = kNone;  // the nearest step of the body, this or before, that plays a waveform
  StepKind kind = StepKind::kWait;
  std::uint8_t markerMask = 0;    // bit n: marker n fires
  std::uint8_t markerOffset = 0;  // samples from its first one
  std::uint8_t clearFlag = 0;     // bit h-1: clears hardware trigger h as it begins
  std::uint8_t trigger = 0;       // hardware trigger that ends a wait, 0 none
};

// A loop of the sequencer. The start and the end of the script are blocks of one step.
struct Block {
  std::uint64_t start = 0;        // in the straight play
  std::uint64_t bodySamples = 0;  // of one pass
  std::uint64_t passes = 1;       // in the straight play: 1 where no count ends them
  std::uint32_t firstStep = 0;
  std::uint32_t endStep = 0;
  std::uint32_t address = 0;                   // of its loop start, or of the one step
  std::uint32_t waveformInside = Step::kNone;  // the last step of the body that plays a waveform
  std::uint32_t waveformBefore = Step::kNone;  // the last one of the blocks before
  ktorba::LoopKind kind = ktorba::LoopKind::kCounted;
  std::uint8_t trigger = 0;    // hardware trigger of an until loop
  std::uint8_t clearFlag = 0;  // acts when the loop is entered

  std::uint64_t sampleCount() const { return extentProduct(bodySamples, passes); }
  bool isCounted() const { return kind == ktorba::LoopKind::kCounted; }
};

// Where the sequencer is: about to begin a step, or at the end of a body where `step` is the block's endStep.
struct Spot {
  std::uint32_t block = 0;
  std::uint64_t pass = 0;
  std::uint32_t step = 0;

  auto operator<=>(const Spot&) const = default;
};

class StraightPlay {
 public:
  static constexpr std::uint32_t kFirstOfRound = 1;  // the block that an endless script jumps back to

  StraightPlay(const Program& program, const ProgramBuilder& builder);

  const std::vector<Step>& steps() const { return steps_; }
  const std::vector<Block>& blocks() const { return blocks_; }
  const std::vector<std::string>& waveforms() const { return waveforms_; }  // names, in the order of their first use
  bool isEndless() const { return isEndless_; }
  std::uint64_t sampleCount() const { return sampleCount_; }
  std::uint64_t roundStart() const { return blocks_[kFirstOfRound].start; }

  const Block& blockOf(const Spot& spot) const { return blocks_[spot.block]; }
  // The step that plays that sample, which lies before sampleCount().
  Spot spotAt(std::uint64_t sample) const;
  // The sample that a step begins with, or a pass ends before. The passes of a loop without a count lie on each other.
  std::uint64_t positionOf(const Spot& spot) const;
  // The step behind that one, once loops without a count are left. The last step's is the end of its body.
  Spot after(const Spot& spot) const;
  Spot startOf(std::uint32_t block) const { return {block, 0, blocks_[block].firstStep}; }

  // The step whose last sample is held as a step begins in that pass of its loop and that round of the script;
  // Step::kNone where nothing has been played yet, which holds level 0.
  std::uint32_t heldStep(const Spot& spot, std::uint64_t round) const;

 private:
  void appendLoop(const Program& program, std::size_t address);
  void appendStep(const Program& program, const ProgramBuilder& builder, std::size_t address);
  std::uint32_t indexOf(const std::string& waveform);
  void closeBlock();

  std::vector<Step> steps_;
  std::vector<Block> blocks_;
  std::vector<std::string> waveforms_;
  std::map<std::string, std::uint32_t, ktcheckname::NameLess> indices_;
  std::uint64_t sampleCount_ = 0;
  bool isEndless_ = false;
  bool isInLoop_ = false;
};

}  // namespace tools
