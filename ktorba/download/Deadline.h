// The time budget of one download, counted from its construction. A negative time-out is no limit at all. The clock is
// read once in a tick of the system's timer: time is up no sooner than it is, and at most a tick later. Reading it for
// every chunk of a long write cost the write 4 % of its time. One thread at a time.
#pragma once

#include <cstdint>
#include <limits>

#include "platform/system/clock.h"

namespace ktorba {

inline constexpr std::int32_t kNoTimeLimit = -1;

class Deadline {
 public:
  explicit Deadline(std::int32_t timeoutMs)
      : startMs_(platform::monotonicMilliseconds()), timeoutMs_(timeoutMs), tick_(platform::monotonicTick()) {}

  bool isUnlimited() const { return timeoutMs_ < 0; }
  bool hasPassed() const { return !isUnlimited() && elapsedMs() >= static_cast<std::uint64_t>(timeoutMs_); }

  // What is left, to begin another Deadline with: 0 when used up, kNoTimeLimit when there is no limit.
  std::int32_t remainingMs() const {
    if (isUnlimited()) return kNoTimeLimit;
    const std::uint64_t elapsed = elapsedMs();
    return elapsed < static_cast<std::uint64_t>(timeoutMs_) ? timeoutMs_ - static_cast<std::int32_t>(elapsed) : 0;
  }

  // What is left, for one call of the FIFO, which has no word for "no limit": then the longest there is, 24 days.
  std::int32_t fifoTimeoutMs() const {
    return isUnlimited() ? std::numeric_limits<std::int32_t>::max() : remainingMs();
  }

 private:
  std::uint64_t elapsedMs() const {
    const std::uint64_t tick = platform::monotonicTick();
    if (tick != tick_) {
      tick_ = tick;
      elapsedMs_ = platform::monotonicMilliseconds() - startMs_;
    }
    return elapsedMs_;
  }

  std::uint64_t startMs_;
  std::int32_t timeoutMs_;
  mutable std::uint64_t tick_;  // in which elapsedMs_ was last learnt
  mutable std::uint64_t elapsedMs_ = 0;
};

}  // namespace ktorba
