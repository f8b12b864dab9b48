#include <gtest/gtest.h>

#include <cstdlib>

#include "ktorba/host_runtime.h"

// What a host exports that has a runtime.
extern "C" KTORBA_EXPORTED std::int32_t PDRNRegisterCleanUpProc(std::int32_t (*)(std::uint32_t), std::uint32_t,
                                                                std::int32_t) {
  return 1;
}

namespace {

TEST(HostRuntime, GivesWayToThatOfTheProgram) {
  EXPECT_EQ(ktHostRuntime_Announce([](void*) { FAIL() << "announced"; }, std::atexit), 0);
}

}  // namespace
