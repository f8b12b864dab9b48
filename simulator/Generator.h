// One simulated generator: its registers, memories, download FIFO, sequencer, and the time that passes for it. Guarded
// by its FPGA's lock.
#pragma once

#include <array>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>

#include "ktorba/hwRecords/registers.h"
#include "ktorba/simulator.h"
#include "simulator/DeviceFaults.h"
#include "simulator/Fifo.h"
#include "simulator/MemoryWrite.h"
#include "simulator/Output.h"
#include "simulator/Sequencer.h"
#include "simulator/StreamingRange.h"

namespace simulator {

class Generator final : public ByteSink {
 public:
  // Instance and FIFO number must have been settled; the traits must be acceptable.
  explicit Generator(const ktSim_Traits& traits);
  Generator(const Generator&) = delete;
  Generator& operator=(const Generator&) = delete;

  // The bounds of each number; what else is asked of them areAcceptable() tells.
  static const ktSim_Traits kLeastTraits;
  static const ktSim_Traits kGreatestTraits;
  // Whether a generator can be made of them; the indices may still be -1.
  static bool areAcceptable(const ktSim_Traits& traits);

  const ktSim_Traits& traits() const { return traits_; }
  const MemoryGeometry& geometry() const { return geometry_; }
  Fifo& fifo() { return fifo_; }
  Sequencer& sequencer() { return sequencer_; }
  DeviceFaults& faults() { return faults_; }

  // Register access, all of which return a code. An access lets time pass first; begin it once per call.
  void beginAccess();
  std::int32_t readRegister(std::uint64_t number, std::uint64_t& value);
  std::int32_t writeRegister(std::uint64_t number, std::uint64_t value);
  // What a read would give, or what was written last.
  std::int32_t peekRegister(std::uint64_t number, std::uint64_t& value) const;
  void overrideRegister(std::uint32_t number, std::optional<std::uint64_t> value) { overrides_[number] = value; }

  // Time.
  void catchUp();  // with the wall clock, where the generator follows it
  std::uint64_t advance(std::uint64_t samples) { return sequencer_.play(samples, *output_); }
  std::uint64_t advanceInto(std::uint64_t samples, void* into, std::uint8_t* markers);
  void setAutoAdvance(std::uint64_t samplesPerAccess);
  void setWallClock(double samplesPerSecond);

  void setOutput(std::unique_ptr<Output> output);  // null for none
  void recordOutput(std::uint64_t capacity);       // 0 for none
  RecordedOutput* recorded() { return recorded_; }

  void setDrainRate(std::uint64_t bytesPerMs);
  void holdMemoryWrites(bool hold) { holdsWrites_ = hold; }

  std::byte* sampleMemory() const { return sampleMemory_.data(); }
  std::byte* sequenceMemory() const { return sequenceMemory_.data(); }
  ktSim_State state() const;
  ktSim_Counters counters() const;

  // The memory write's end of the FIFO.
  std::uint64_t wanted() const override { return write_.bytesMissing(); }
  void take(const std::uint8_t* bytes, std::uint64_t count) override;

 private:
  static constexpr std::size_t kRegisterCount = 32;

  std::uint64_t written(ktorba::Register number) const { return written_[static_cast<std::size_t>(number)]; }
  std::int32_t checkRegister(std::uint64_t number, ktorba::RegisterAccess access) const;
  std::uint64_t valueOf(ktorba::Register number) const;
  std::uint64_t statusBits() const;
  std::int32_t command(std::uint64_t code);
  void initiate();
  void announceMemoryWrite();
  void restartClock();

  ktSim_Traits traits_;
  MemoryGeometry geometry_;
  std::uint32_t downloadElementBytes_;
  platform::LazyMemory sampleMemory_;
  platform::LazyMemory sequenceMemory_;
  StreamingRange streaming_;
  DeviceFaults faults_;
  ktSim_Counters counters_{};
  Fifo fifo_;
  Sequencer sequencer_;

  MemoryWrite write_;
  bool isSequenceWrite_ = false;
  std::uint64_t writeAddress_ = 0;  // of the write in progress, bytes
  bool isWriteInside_ = false;
  bool holdsWrites_ = false;

  std::array<std::uint64_t, kRegisterCount> written_{};
  std::array<std::optional<std::uint64_t>, kRegisterCount> overrides_{};

  std::unique_ptr<Output> output_;
  RecordedOutput* recorded_ = nullptr;  // output_, when it is a recording
  std::uint64_t samplesPerAccess_ = 0;
  double wallClockRate_ = 0;  // samples per second; 0: not followed
  std::uint64_t clockStartMs_ = 0;
  std::uint64_t clockStartSample_ = 0;
};

}  // namespace simulator
