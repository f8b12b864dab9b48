#include "ktorba/download/Deadline.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>

namespace ktorba {
namespace {

TEST(Deadline, passesNoSoonerThanItsTime) {
  using Clock = std::chrono::steady_clock;
  for (const std::int32_t timeoutMs : {1, 3, 30}) {
    const auto before = Clock::now();
    const Deadline deadline(timeoutMs);
    std::int32_t least = timeoutMs;
    while (!deadline.hasPassed()) {
      const std::int32_t remaining = deadline.remainingMs();
      EXPECT_LE(remaining, least);
      least = std::min(least, remaining);
    }
    EXPECT_EQ(deadline.remainingMs(), 0);
    // Milliseconds are cut, so the first one may be short.
    EXPECT_GT(Clock::now() - before, std::chrono::milliseconds(timeoutMs - 1));
  }
  EXPECT_TRUE(Deadline(0).hasPassed());
  EXPECT_FALSE(Deadline(kNoTimeLimit).hasPassed());
}

}  // namespace
}  // namespace ktorba
