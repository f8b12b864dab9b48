// One DMA FIFO of bytes: a download FIFO, whose bytes the device takes as its memory writes want them, or a loop-back
// FIFO, which the host reads itself. Waiting takes no real time: a time-out is the number of milliseconds that the
// device may drain for. Guarded by its FPGA's lock.
#pragma once

#include <cstdint>
#include <string>

#include "ktorba/simulator.h"
#include "simulator/LazyQueue.h"

namespace simulator {

// The device's end of a download FIFO.
class ByteSink {
 public:
  virtual ~ByteSink() = default;
  // Bytes that it can take now.
  virtual std::uint64_t wanted() const = 0;
  virtual void take(const std::uint8_t* bytes, std::uint64_t count) = 0;
};

class Fifo {
 public:
  // A null sink makes a loop-back FIFO.
  Fifo(std::string name, ByteSink* sink);

  const std::string& name() const { return name_; }
  bool isLoopback() const { return sink_ == nullptr; }
  std::uint64_t depth() const { return queue_.capacity(); }
  std::uint64_t level() const { return queue_.size(); }

  // All of these return a code. Configuring and stopping throw away what is in the FIFO and leave it stopped.
  std::int32_t configure(std::uint64_t requestedDepth, std::uint64_t* actualDepth);
  std::int32_t start();
  std::int32_t stop();
  // Writes all or nothing. `room` is written also with KTSIM_E_TIMEOUT.
  std::int32_t write(const std::uint8_t* bytes, std::uint64_t count, std::uint32_t timeoutMs, std::uint64_t* room);
  std::int32_t read(std::uint8_t* bytes, std::uint64_t count, std::uint64_t* left);
  // At least one element when any is asked for; contiguous. The elements stay the host's until they are released.
  std::int32_t acquireWrite(std::uint8_t** elements, std::uint64_t count, std::uint32_t timeoutMs,
                            std::uint64_t* acquired, std::uint64_t* room);
  std::int32_t acquireRead(std::uint8_t** elements, std::uint64_t count, std::uint64_t* acquired, std::uint64_t* left);
  std::int32_t release(std::uint64_t count);

  void setDrainRate(std::uint64_t bytesPerMs) { drainPerMs_ = bytesPerMs; }
  // Lets the device take what it wants and the drain rate gives in one millisecond.
  void drain() { drain(budget(1)); }
  // For a device that takes bytes as they arrive: some have, or it has begun to want them.
  void drainAtOnce();

 private:
  std::uint64_t budget(std::uint32_t ms) const;
  void drain(std::uint64_t most);
  bool isAcquired() const { return acquiredForWrite_ + acquiredForRead_ != 0; }
  std::int32_t refusal() const;

  std::string name_;
  ByteSink* sink_;
  LazyQueue<std::uint8_t> queue_;
  bool started_ = false;
  std::uint64_t drainPerMs_ = KTSIM_DRAIN_AT_ONCE;
  std::uint64_t acquiredForWrite_ = 0;
  std::uint64_t acquiredForRead_ = 0;
};

}  // namespace simulator
