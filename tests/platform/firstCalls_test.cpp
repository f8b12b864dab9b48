#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <barrier>
#include <thread>

#include "platform/KtFpgaDouble.h"
#include "platform/KtFpgaLibrary.h"

namespace {

TEST(BoundFunction, BindsOnceForThreadsThatCallFirstTogether) {
  std::barrier start(4);
  std::vector<std::jthread> threads;
  for (std::uint32_t fifo = 0; fifo < 4; ++fifo) {
    threads.emplace_back([&start, fifo] {
      start.arrive_and_wait();
      platform::KtFpga().StartFifo(1, fifo);
    });
  }
  threads.clear();
  EXPECT_THAT(ktFpgaDouble().record.take(),
              testing::UnorderedElementsAre("StartFifo 1 0", "StartFifo 1 1", "StartFifo 1 2", "StartFifo 1 3"));
}

}  // namespace
