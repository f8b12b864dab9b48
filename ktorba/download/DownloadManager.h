// Moves bytes from the host into the FPGA's memories. Each transfer is announced through the generator's registers,
// streamed through the download FIFO (lead pad, data, trail pad) in chunks that fit its free space, and then polled
// for until the generator reports it complete, all under one deadline. Data is sent from where the caller holds it.
// One thread at a time.
#pragma once

#include "ktorba/commandControl/CommandControlInterface.h"
#include "ktorba/download/DataWrapperInterface.h"
#include "ktorba/download/Deadline.h"
#include "ktorba/download/DownloadFifo.h"
#include "ktorba/hwRecords/Interfaces.h"

namespace ktorba {

class DownloadManagerInterface {
 public:
  virtual ~DownloadManagerInterface() = default;

  // Gives the download FIFO a depth of at least that many bytes on the host's side. Raises what the FPGA reports.
  virtual void configureFifoDepth(std::uint64_t depth) = 0;

  // Performs one transfer and returns when the generator reports it complete. A negative `timeoutMs` sets no limit.
  // Raises ktorba_errors::kErrorWriteWaveformTimeout, or what the FPGA and the register bus report. A transfer that
  // fails after it was announced may still be taking data; the next one waits for it first, on its own time. One whose
  // bytes were not all sent never completes: resetting the generator ends it.
  virtual void writeData(const MemoryWriteRequest& request, const DataWrapperInterface& data,
                         std::int32_t timeoutMs) = 0;

  // Fills address, size, masks and pads of a write of `dataBytes` at `byteOffset` behind `baseAddress`, so that whole
  // memory words are sent, and adds the bytes sent to `totalBytes`, from which the size is taken.
  virtual void prepareSampleWrite(std::uint64_t dataBytes, std::uint32_t baseAddress, std::uint64_t byteOffset,
                                  std::uint64_t& totalBytes, MemoryWriteRequest& out) = 0;
};

class DownloadManager : public DownloadManagerInterface,
                        public TransitionableInterface,
                        public HWTraitReceiverInterface,
                        public SettingReceiverInterface {
 public:
  // Configures and starts `fifo`. Borrows both objects. Needs traits (receiveHWTraits) before it can write.
  DownloadManager(CommandControlInterface& commandControl, ktisl::Fifo<unsigned char>& fifo);

  void configureFifoDepth(std::uint64_t depth) override;
  void writeData(const MemoryWriteRequest& request, const DataWrapperInterface& data, std::int32_t timeoutMs) override;
  void prepareSampleWrite(std::uint64_t dataBytes, std::uint32_t baseAddress, std::uint64_t byteOffset,
                          std::uint64_t& totalBytes, MemoryWriteRequest& out) override;

  // Transfers announced so far; one whose announcement failed does not count: nothing of it was sent.
  std::uint64_t announcedWrites() const { return announcedWrites_; }

  void configure(bool) override {}
  void prepare() override {}
  void initiate() override {}
  void reset() override;
  void abort() override {}

  void receiveHWTraits(const HWTraits& traits) override;
  void receiveSettings(const HWSettingsRecord& settings) override;

 private:
  void announce(const MemoryWriteRequest& request);
  // Sends `count` zero bytes and returns the FIFO's free space behind them.
  std::uint64_t writePad(std::uint64_t count, const Deadline& deadline);
  void sendData(const MemoryWriteRequest& request, const DataWrapperInterface& data, std::uint64_t freeBytes,
                const Deadline& deadline);
  // Fills up to `count` bytes of FIFO memory in place; returns how many.
  std::uint64_t copyChunk(const DataWrapperInterface& data, std::uint64_t offset, std::uint64_t count,
                          std::uint64_t& freeBytes, const Deadline& deadline);
  void waitForPreviousWrite(const Deadline& deadline);
  void waitForWriteComplete(const Deadline& deadline);
  bool isWriteComplete();

  CommandControlInterface* commandControl_;
  DownloadFifo fifo_;
  HWTraits traits_;
  HWSettingsRecord settings_;  // kept for those to come; nothing here reads it
  std::uint64_t announcedWrites_ = 0;
  bool downloadInProgress_ = false;  // announced, and not yet seen complete
  bool allBytesSent_ = false;        // of the transfer announced last
};

}  // namespace ktorba
