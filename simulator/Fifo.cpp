#include "simulator/Fifo.h"

#include <algorithm>
#include <utility>

namespace simulator {
namespace {

constexpr std::uint64_t kDepthGranularity = 4096;

}  // namespace

Fifo::Fifo(std::string name, ByteSink* sink) : name_(std::move(name)), sink_(sink), queue_(kDepthGranularity) {}

std::int32_t Fifo::configure(std::uint64_t requestedDepth, std::uint64_t* actualDepth) {
  if (actualDepth == nullptr || requestedDepth > UINT64_MAX - kDepthGranularity) return KTSIM_E_ARGUMENT;
  const std::uint64_t blocks = std::max<std::uint64_t>(1, (requestedDepth + kDepthGranularity - 1) / kDepthGranularity);
  queue_ = LazyQueue<std::uint8_t>(blocks * kDepthGranularity);
  *actualDepth = depth();
  return stop();
}

std::int32_t Fifo::start() {
  started_ = true;
  return 0;
}

std::int32_t Fifo::stop() {
  started_ = false;
  queue_.clear();
  acquiredForWrite_ = acquiredForRead_ = 0;
  return 0;
}

std::int32_t Fifo::refusal() const {
  if (!started_) return KTSIM_E_FIFO_STOPPED;
  return isAcquired() ? KTSIM_E_FIFO_BUSY : 0;
}

std::uint64_t Fifo::budget(std::uint32_t ms) const {
  if (drainPerMs_ == KTSIM_DRAIN_AT_ONCE) return UINT64_MAX;
  return drainPerMs_ > UINT64_MAX / std::max(ms, 1u) ? UINT64_MAX : drainPerMs_ * ms;
}

void Fifo::drain(std::uint64_t most) {
  if (sink_ == nullptr || isAcquired()) return;
  const std::uint64_t count = std::min({most, sink_->wanted(), level()});
  if (count == 0) return;
  sink_->take(queue_.head(), count);
  queue_.consume(count);
}

void Fifo::drainAtOnce() {
  if (drainPerMs_ == KTSIM_DRAIN_AT_ONCE) drain();
}

std::int32_t Fifo::write(const std::uint8_t* bytes, std::uint64_t count, std::uint32_t timeoutMs, std::uint64_t* room) {
  if (const std::int32_t code = refusal()) return code;
  if (bytes == nullptr && count != 0) return KTSIM_E_ARGUMENT;
  drain();
  const std::uint64_t wanted = sink_ == nullptr ? 0 : sink_->wanted();
  const std::uint64_t drainable = std::min(wanted, budget(timeoutMs));
  const std::uint64_t overflow = count > queue_.room() ? count - queue_.room() : 0;
  const bool fits = overflow <= drainable;
  if (fits) {
    // What the device takes while this call waits: bytes that were there before, then the caller's own.
    const bool isAtOnce = drainPerMs_ == KTSIM_DRAIN_AT_ONCE;
    const std::uint64_t taken = isAtOnce ? std::min(wanted, level() + count) : overflow;
    const std::uint64_t passedOn = taken > level() ? taken - level() : 0;
    drain(taken);
    if (passedOn != 0) sink_->take(bytes, passedOn);
    queue_.push(bytes + passedOn, count - passedOn);
  } else {
    drain(drainable);
  }
  if (room != nullptr) *room = queue_.room();
  return fits ? 0 : KTSIM_E_TIMEOUT;
}

std::int32_t Fifo::read(std::uint8_t* bytes, std::uint64_t count, std::uint64_t* left) {
  if (!isLoopback()) return KTSIM_E_FIFO;
  if (const std::int32_t code = refusal()) return code;
  if (bytes == nullptr && count != 0) return KTSIM_E_ARGUMENT;
  const bool isThere = count <= level();
  if (isThere && count != 0) {
    std::copy_n(queue_.head(), count, bytes);
    queue_.consume(count);
  }
  if (left != nullptr) *left = level();
  return isThere ? 0 : KTSIM_E_TIMEOUT;
}

std::int32_t Fifo::acquireWrite(std::uint8_t** elements, std::uint64_t count, std::uint32_t timeoutMs,
                                std::uint64_t* acquired, std::uint64_t* room) {
  if (const std::int32_t code = refusal()) return code;
  if (elements == nullptr || acquired == nullptr) return KTSIM_E_ARGUMENT;
  drain();
  if (count > queue_.room()) drain(std::min(budget(timeoutMs), count - queue_.room()));
  const std::uint64_t granted = std::min(count, queue_.room());
  if (room != nullptr) *room = queue_.room() - granted;
  if (granted == 0 && count != 0) return KTSIM_E_TIMEOUT;
  *elements = queue_.tail();
  *acquired = acquiredForWrite_ = granted;
  return 0;
}

std::int32_t Fifo::acquireRead(std::uint8_t** elements, std::uint64_t count, std::uint64_t* acquired,
                               std::uint64_t* left) {
  if (!isLoopback()) return KTSIM_E_FIFO;
  if (const std::int32_t code = refusal()) return code;
  if (elements == nullptr || acquired == nullptr) return KTSIM_E_ARGUMENT;
  const std::uint64_t granted = std::min(count, level());
  if (left != nullptr) *left = level() - granted;
  if (granted == 0 && count != 0) return KTSIM_E_TIMEOUT;
  *elements = const_cast<std::uint8_t*>(queue_.head());
  *acquired = acquiredForRead_ = granted;
  return 0;
}

std::int32_t Fifo::release(std::uint64_t count) {
  if (count > acquiredForWrite_ + acquiredForRead_) return KTSIM_E_FIFO_BUSY;
  if (acquiredForWrite_ != 0) {
    queue_.produce(count);
    acquiredForWrite_ -= count;
  } else {
    queue_.consume(count);
    acquiredForRead_ -= count;
  }
  drainAtOnce();
  return 0;
}

}  // namespace simulator
