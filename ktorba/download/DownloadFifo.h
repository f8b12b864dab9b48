// The byte FIFO as the download path uses it: the configured depth is remembered, used-up time-outs are refused with
// the engine's own error, and every failure of the FPGA is an exception. One thread at a time.
#pragma once

#include <cstdint>

#include "ktisl/Fifo.h"
#include "ktorba/hwRecords/HWTraits.h"

namespace ktorba {

class DownloadFifoInterface {
 public:
  virtual ~DownloadFifoInterface() = default;

  // Stops the FIFO and starts it again.
  virtual void restart() = 0;

  // Configures and starts the FIFO, unless `requestedDepth` (bytes) is the depth that was set last.
  virtual void configureDepth(std::uint64_t requestedDepth) = 0;

  // Returns the bytes that can be written without waiting.
  virtual std::uint64_t freeSpace(std::uint32_t timeoutMs) = 0;

  // Writes `count` bytes and tells how many more fit without waiting. Raises ktorba_errors::kErrorWriteWaveformTimeout
  // below 1 ms, before the FIFO is touched.
  virtual void write(const std::uint8_t* data, std::uint64_t count, std::int32_t timeoutMs,
                     std::uint64_t& emptyRemaining) = 0;

  // Gives `acquired` bytes of FIFO memory to fill in place, at most `count`; refuses used-up time-outs as write().
  virtual void acquireWriteElements(std::uint8_t*& elements, std::uint64_t count, std::int32_t timeoutMs,
                                    std::uint64_t& acquired, std::uint64_t& emptyRemaining) = 0;

  // Gives acquired memory back, its first `count` bytes as written.
  virtual void releaseElements(std::uint64_t count) = 0;
};

class TraitsReceiverInterface {
 public:
  virtual void receiveTraits(const HWTraits& traits) = 0;
  virtual ~TraitsReceiverInterface() = default;
};

class DownloadFifo : public DownloadFifoInterface, public TraitsReceiverInterface {
 public:
  // Borrows `fifo` for the life of this object.
  explicit DownloadFifo(ktisl::Fifo<unsigned char>& fifo) : fifo_(&fifo) {}

  void restart() override;
  void configureDepth(std::uint64_t requestedDepth) override;
  std::uint64_t freeSpace(std::uint32_t timeoutMs) override;
  void write(const std::uint8_t* data, std::uint64_t count, std::int32_t timeoutMs,
             std::uint64_t& emptyRemaining) override;
  void acquireWriteElements(std::uint8_t*& elements, std::uint64_t count, std::int32_t timeoutMs,
                            std::uint64_t& acquired, std::uint64_t& emptyRemaining) override;
  void releaseElements(std::uint64_t count) override;

  void receiveTraits(const HWTraits& traits) override { traits_ = traits; }

 private:
  ktisl::Fifo<unsigned char>* fifo_;
  std::uint64_t depth_ = 0;  // bytes, as the FPGA set it; 0 until it was configured
  HWTraits traits_;          // kept for those to come; nothing here reads it
};

}  // namespace ktorba
