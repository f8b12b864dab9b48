#include "platform/system/clock.h"

#include <time.h>

namespace platform {
namespace {

#ifdef CLOCK_MONOTONIC_COARSE
constexpr clockid_t kTickClock = CLOCK_MONOTONIC_COARSE;
#else
constexpr clockid_t kTickClock = CLOCK_MONOTONIC;
#endif

std::uint64_t nanoseconds(clockid_t clock) {
  timespec now{};
  clock_gettime(clock, &now);
  return static_cast<std::uint64_t>(now.tv_sec) * 1'000'000'000 + static_cast<std::uint64_t>(now.tv_nsec);
}

}  // namespace

std::uint64_t monotonicMilliseconds() { return nanoseconds(CLOCK_MONOTONIC) / 1'000'000; }

std::uint64_t monotonicTick() { return nanoseconds(kTickClock); }

}  // namespace platform
