#include "ktorba/download/DownloadFifo.h"

#include "kterr/Failure.h"
#include "ktorba/commandControl/raisingLocated.h"

namespace ktorba {
namespace {

using Status = kterr::tLocatedStatus;

constexpr char kSource[] = R"(includes\ktorba\download\DownloadFifo)";
constexpr std::uint8_t kNoData = 0;  // what an empty write points at

[[noreturn]] void raiseTimeout() { kterr::Failure(ktorba_errors::kErrorWriteWaveformTimeout).at(kSource).raise(); }

std::uint32_t requireTimeLeft(std::int32_t timeoutMs) {
  if (timeoutMs < 1) raiseTimeout();
  return static_cast<std::uint32_t>(timeoutMs);
}

}  // namespace

void DownloadFifo::restart() {
  raisingLocated([&](Status& status) { fifo_->restart(status); });
}

void DownloadFifo::configureDepth(std::uint64_t requestedDepth) {
  if (requestedDepth == depth_) return;
  std::uint64_t actualDepth = 0;
  if (raisingLocated([&](Status& status) { fifo_->configure(requestedDepth, actualDepth, status); }) &&
      raisingLocated([&](Status& status) { fifo_->start(status); })) {
    depth_ = actualDepth;
  }
}

std::uint64_t DownloadFifo::freeSpace(std::uint32_t timeoutMs) {
  std::uint64_t emptyRemaining = 0;
  raisingLocatedOr(raiseTimeout, [&](Status& status) { fifo_->write(&kNoData, 0, timeoutMs, emptyRemaining, status); });
  return emptyRemaining;
}

void DownloadFifo::write(const std::uint8_t* data, std::uint64_t count, std::int32_t timeoutMs,
                         std::uint64_t& emptyRemaining) {
  const std::uint32_t timeLeftMs = requireTimeLeft(timeoutMs);
  raisingLocatedOr(raiseTimeout,
                   [&](Status& status) { fifo_->write(data, count, timeLeftMs, emptyRemaining, status); });
}

void DownloadFifo::acquireWriteElements(std::uint8_t*& elements, std::uint64_t count, std::int32_t timeoutMs,
                                        std::uint64_t& acquired, std::uint64_t& emptyRemaining) {
  const std::uint32_t timeLeftMs = requireTimeLeft(timeoutMs);
  raisingLocatedOr(raiseTimeout, [&](Status& status) {
    fifo_->acquireWriteElements(elements, count, timeLeftMs, acquired, emptyRemaining, status);
  });
}

void DownloadFifo::releaseElements(std::uint64_t count) {
  raisingLocated([&](Status& status) { fifo_->releaseElements(count, status); });
}

}  // namespace ktorba
