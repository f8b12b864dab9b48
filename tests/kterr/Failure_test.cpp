#include "kterr/Failure.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {
TEST(Failure, WritesElaboration) {
  try {
    kterr::Failure(ktorba_errors::kErrorSpecifiedWaveformNotFound)
        .at("src", 221)
        .message("a", "b")
        .usage(kterr::kUsageTypeWaveformName, "wave1")
        .usage("x", std::uint64_t{7})
        .usage("f", 0.5f)
        .raise();
  } catch (const std::exception& e) {
    EXPECT_THAT(e.what(), testing::StartsWith("{\"error_constant\":\"ktorba_errors::kErrorSpecifiedWaveformNotFound\""));
  }
}
}  // namespace
