// The sequencer: executes the instructions in sequence memory and emits samples with marker bits. It moves only when
// told to play; an instruction begins when its first sample is wanted, so a trigger raised between two calls counts
// for the pass that has just ended. Guarded by its FPGA's lock.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <vector>

#include "conventions/conventions.h"
#include "ktorba/simulator.h"
#include "platform/system/LazyMemory.h"
#include "simulator/DeviceFaults.h"
#include "simulator/LazyQueue.h"
#include "simulator/Output.h"
#include "simulator/Step.h"
#include "simulator/StreamingRange.h"

namespace simulator {

class Sequencer {
 public:
  static constexpr std::size_t kMostLoops = 16;
  static constexpr std::size_t kMostScheduled = 4096;

  struct GeneratorParts {
    MemoryGeometry geometry;
    const std::byte* sampleMemory;
    const SequenceInstructionWords* sequenceMemory;
    StreamingRange& streaming;
    DeviceFaults& faults;
    ktSim_Counters& counters;
  };
  explicit Sequencer(const GeneratorParts& parts);

  void initiate();
  void abort() { isRunning_ = false; }
  // Stops, and forgets triggers and status.
  void reset();
  // Plays up to `count` samples; returns how many there were.
  std::uint64_t play(std::uint64_t count, Output& output);
  // Instructions that have been rewritten, the last one included.
  void rewritten(std::uint64_t firstAddress, std::uint64_t lastAddress);

  // Hardware triggers 1 to 8. Scheduling returns false when kMostScheduled are waiting.
  void raise(std::uint32_t trigger);
  bool raiseAt(std::uint32_t trigger, std::uint64_t sample);

  void setTrace(LazyQueue<ktSim_TraceEntry> trace) { trace_ = std::move(trace); }
  LazyQueue<ktSim_TraceEntry>& trace() { return trace_; }

  bool isRunning() const { return isRunning_; }
  bool isDone() const { return isDone_; }
  bool hasUnderflow() const { return hasUnderflow_; }
  std::uint64_t position() const { return position_; }
  void describe(ktSim_State& state) const;

 private:
  static constexpr std::uint64_t kNone = UINT64_MAX;

  struct Loop {
    std::uint32_t bodyAddress;
    std::uint32_t pass;
    SequenceInstructionWords words;  // of the loop start
  };
  struct Scheduled {
    std::uint64_t sample;
    std::uint32_t trigger;
  };

  const Step& stepAt(std::uint32_t address);
  std::uint64_t fill(const OutputWindow& window, std::uint64_t count);
  std::uint64_t fillBlock(const OutputWindow& block, std::uint64_t count);
  bool beginSamples();
  void beginNextPass();
  void execute();
  void beginEmission(const Step& step);
  void enterLoop(const Step& step);
  void endLoop(const Step& step);
  void fail(std::int32_t code, const char* reason);

  void emit(std::byte* samples, std::uint8_t* markers, std::uint64_t count);
  void emitFetched(std::byte* samples, std::uint64_t count);
  void emitHeld(std::byte* samples, std::uint64_t count) const;
  void holdLastFetched();
  void emitMarker(std::uint8_t* markers, std::uint64_t count);

  bool isWaitingForTrigger() const { return step_.kind != StepKind::kFetch && step_.trigger != 0; }
  bool isLatched(std::uint8_t trigger) const { return (latches_ & ktorba::clearFlagOf(trigger)) != 0; }
  void latchDue();
  void trace(const SequenceInstructionWords& words);

  GeneratorParts parts_;
  platform::LazyMemory steps_;  // a Step per address, kUnread until it is executed
  LazyQueue<ktSim_TraceEntry> trace_;

  bool isRunning_ = false;
  bool isDone_ = false;
  bool hasUnderflow_ = false;
  std::uint8_t latches_ = 0;
  std::vector<Scheduled> scheduled_;  // by sample
  std::uint64_t nextDue_ = UINT64_MAX;

  std::uint64_t position_ = 0;  // samples played since initiate
  std::uint32_t address_ = 0;   // of step_, or of the instruction under way
  std::uint32_t next_ = 0;
  Step step_{};                        // the one that emits samples
  std::uint64_t samplesLeft_ = 0;      // of it; whole passes more while it waits for a trigger
  std::uint64_t nextSample_ = 0;       // of a fetch, from the start of sample memory
  std::uint32_t held_ = 0;             // the last sample played, unless it is still to be read from lastFetched_
  std::uint64_t lastFetched_ = kNone;  // read when a wait begins or playing pauses, since most are never held
  std::array<Loop, kMostLoops> loops_{};
  std::size_t loopDepth_ = 0;
};

}  // namespace simulator
