#include "ktorba/download/DownloadManager.h"

#include <algorithm>
#include <exception>

#include "kterr/Failure.h"
#include "ktorba/commandControl/raisingLocated.h"

namespace ktorba {
namespace {

using Status = kterr::tLocatedStatus;

constexpr char kSource[] = R"(includes\ktorba\download\DownloadManager)";
constexpr std::uint64_t kInitialFifoDepth = 40960;

// Pads are shorter than a memory word, whose bits a 16-bit trait counts.
constexpr std::uint8_t kZeros[0xFFFF / 8] = {};

// The lowest `count` bits; a byte mask has no more than 64.
std::uint64_t lowBits(std::uint64_t count) { return count < 64 ? (std::uint64_t{1} << count) - 1 : ~std::uint64_t{0}; }

// FIFO memory being filled in place. Given back in any case; a failure to do so is raised by release() alone.
class AcquiredElements {
 public:
  AcquiredElements(DownloadFifo& fifo, std::uint64_t count) : fifo_(fifo), count_(count) {}
  ~AcquiredElements() {
    if (released_) return;
    try {
      fifo_.releaseElements(count_);
    } catch (const std::exception&) {  // the failure on its way is the one to report
    }
  }
  AcquiredElements(const AcquiredElements&) = delete;
  AcquiredElements& operator=(const AcquiredElements&) = delete;

  void release() {
    released_ = true;
    fifo_.releaseElements(count_);
  }

 private:
  DownloadFifo& fifo_;
  std::uint64_t count_;
  bool released_ = false;
};

[[noreturn]] void raiseTimeout() { kterr::Failure(ktorba_errors::kErrorWriteWaveformTimeout).at(kSource).raise(); }

}  // namespace

DownloadManager::DownloadManager(CommandControlInterface& commandControl, ktisl::Fifo<unsigned char>& fifo)
    : commandControl_(&commandControl), fifo_(fifo) {
  fifo_.configureDepth(kInitialFifoDepth);
}

void DownloadManager::configureFifoDepth(std::uint64_t depth) { fifo_.configureDepth(depth); }

void DownloadManager::writeData(const MemoryWriteRequest& request, const DataWrapperInterface& data,
                                std::int32_t timeoutMs) {
  // Chunks of no bytes never end: then even a caller who sets no limit is told so rather than kept for ever.
  const bool neverEnds = timeoutMs < 0 && request.maxChunkBytes == 0;
  const Deadline deadline(neverEnds ? 0 : timeoutMs);
  waitForPreviousWrite(deadline);
  announce(request);
  const std::uint64_t freeBytes = request.leadPadBytes != 0
                                      ? writePad(request.leadPadBytes, deadline)
                                      : fifo_.freeSpace(static_cast<std::uint32_t>(deadline.fifoTimeoutMs()));
  sendData(request, data, freeBytes, deadline);
  if (request.trailPadBytes != 0) writePad(request.trailPadBytes, deadline);
  allBytesSent_ = true;
  waitForWriteComplete(deadline);
}

void DownloadManager::prepareSampleWrite(std::uint64_t dataBytes, std::uint32_t baseAddress, std::uint64_t byteOffset,
                                         std::uint64_t& totalBytes, MemoryWriteRequest& out) {
  const std::uint64_t wordBytes = traits_.memoryWordBytes();
  const std::uint64_t lead = byteOffset % wordBytes;
  const std::uint64_t trail = (wordBytes - (lead + dataBytes) % wordBytes) % wordBytes;
  totalBytes += lead + dataBytes + trail;
  out.maskedWrite = 1;
  out.memoryAddress = static_cast<std::uint32_t>(byteOffset - lead) + baseAddress;
  out.transferElements = static_cast<std::uint32_t>(totalBytes / (traits_.downloadElementBits / 8));
  out.leadPadBytes = lead;
  out.trailPadBytes = trail;
  out.firstWordByteMask = ~lowBits(lead);
  out.lastWordByteMask = trail == 0 ? ~std::uint64_t{0} : lowBits(wordBytes - trail);
  if (totalBytes <= wordBytes) {
    out.firstWordByteMask &= out.lastWordByteMask;
    out.lastWordByteMask = out.firstWordByteMask;
  }
}

void DownloadManager::reset() { fifo_.restart(); }

void DownloadManager::receiveHWTraits(const HWTraits& traits) {
  fifo_.receiveTraits(traits);
  traits_ = traits;
}

void DownloadManager::receiveSettings(const HWSettingsRecord& settings) { settings_ = settings; }

void DownloadManager::announce(const MemoryWriteRequest& request) {
  raisingLocatedOr(raiseTimeout, [&](Status& status) { commandControl_->announceMemoryWrite(request, status); });
  ++announcedWrites_;
  downloadInProgress_ = true;
  allBytesSent_ = false;
}

std::uint64_t DownloadManager::writePad(std::uint64_t count, const Deadline& deadline) {
  std::uint64_t freeBytes = 0;
  fifo_.write(kZeros, count, deadline.fifoTimeoutMs(), freeBytes);
  return freeBytes;
}

void DownloadManager::sendData(const MemoryWriteRequest& request, const DataWrapperInterface& data,
                               std::uint64_t freeBytes, const Deadline& deadline) {
  const std::uint64_t sampleBytes = traits_.sampleBytes();
  std::uint64_t offset = request.dataOffset;
  std::uint64_t remaining = request.byteCount;
  while (remaining > 0) {
    // A full FIFO makes an empty chunk, whose write reports the free space again or that time is up.
    std::uint64_t chunk = std::min({request.maxChunkBytes, freeBytes - freeBytes % sampleBytes, remaining});
    if (data.mustCopy()) {
      chunk = copyChunk(data, offset, chunk, freeBytes, deadline);
    } else {
      fifo_.write(data.getPointer(offset), chunk, deadline.fifoTimeoutMs(), freeBytes);
    }
    remaining -= chunk;
    offset += chunk;
  }
}

std::uint64_t DownloadManager::copyChunk(const DataWrapperInterface& data, std::uint64_t offset, std::uint64_t count,
                                         std::uint64_t& freeBytes, const Deadline& deadline) {
  std::uint8_t* elements = nullptr;
  std::uint64_t acquired = 0;
  fifo_.acquireWriteElements(elements, count, deadline.fifoTimeoutMs(), acquired, freeBytes);
  const std::uint64_t filled = std::min(acquired, count);  // what is granted beyond that is not the data's
  AcquiredElements held(fifo_, filled);
  data.copyTo(elements, offset, filled);
  held.release();
  return filled;
}

void DownloadManager::waitForPreviousWrite(const Deadline& deadline) {
  // Nobody is going to send what a transfer cut short still lacks: it has ended by a reset, or not at all.
  waitForWriteComplete(deadline.isUnlimited() && !allBytesSent_ ? Deadline(0) : deadline);
}

void DownloadManager::waitForWriteComplete(const Deadline& deadline) {
  if (!downloadInProgress_) return;
  bool complete = isWriteComplete();
  while (!complete && !deadline.hasPassed()) complete = isWriteComplete();
  // The completion may have come between the last look and the deadline.
  if (!complete && !isWriteComplete()) raiseTimeout();
  downloadInProgress_ = false;
}

bool DownloadManager::isWriteComplete() {
  bool complete = false;
  raisingLocatedOr(raiseTimeout, [&](Status& status) { commandControl_->readMemoryWriteComplete(complete, status); });
  return complete;
}

}  // namespace ktorba
