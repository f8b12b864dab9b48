#include <gmock/gmock.h>

#include <algorithm>
#include <numeric>

#include "testing/SimulatedDevice.h"

namespace ktorba {
namespace {

class Fifo : public testing::Test, protected SimulatedDevice {
 protected:
  std::int32_t acquire(std::uint64_t count, std::uint32_t timeoutMs) {
    return KtFpgaDll_AcquireFifoWriteElementsU8(fpga.fpgaSession, fifo, &elements, count, timeoutMs, &acquired, &room);
  }
  std::int32_t release(std::uint64_t count) { return KtFpgaDll_ReleaseFifoElements(fpga.fpgaSession, fifo, count); }

  std::uint8_t* elements = nullptr;
  std::uint64_t acquired = 0;
  std::uint64_t room = 0;
};

TEST_F(Fifo, DepthIsRoundedUpToBlocks) {
  const auto configure = [&](std::uint64_t depth) {
    return KtFpgaDll_ConfigureFifo2(fpga.fpgaSession, fifo, depth, &room);
  };
  EXPECT_EQ(configure(0), 0);
  EXPECT_EQ(room, 4096u);
  for (const std::uint64_t huge : {UINT64_MAX, UINT64_MAX - 5000, std::uint64_t{1} << 60}) {
    EXPECT_LT(configure(huge), 0) << huge;
  }
  EXPECT_EQ(state().fifoDepth, 4096u);
}

// 4096 + 1100 bytes into a memory write, 100 bytes per millisecond: the overflow needs 10 ms of waiting.
TEST_F(Fifo, ThrottledDrainTakesTheTimeThatAWriteWaits) {
  ktSim_Traits roomy = bytewiseTraits();
  roomy.memorySizeBytes = 16384;
  SimulatedDevice device(roomy);
  ASSERT_EQ(ktSim_SetDrainRate(device.number, 100), 0);
  device.announce({1, 0, 16384});
  ASSERT_EQ(device.send(Bytes(4096, 1), 1, &room), 0);
  EXPECT_EQ(room, 0u);
  // Each try drains 100 bytes before it, too.
  EXPECT_EQ(device.send(Bytes(1100, 2), 9, &room), KTSIM_E_TIMEOUT);
  EXPECT_EQ(room, 1000u);
  EXPECT_EQ(device.send(Bytes(1100, 2), 0, &room), 0);
  EXPECT_EQ(room, 0u);
  Bytes large(8000);
  std::iota(large.begin(), large.end(), std::uint8_t{0});
  EXPECT_EQ(device.send(large, 80, &room), 0) << "larger than the FIFO, drained as it comes";
  ASSERT_EQ(ktSim_SetDrainRate(device.number, 0), 0);
  EXPECT_EQ(device.send(Bytes(1, 4), 4'000'000'000, &room), KTSIM_E_TIMEOUT);
  ASSERT_EQ(ktSim_SetDrainRate(device.number, KTSIM_DRAIN_AT_ONCE), 0);
  EXPECT_EQ(room, 0u);
  EXPECT_EQ(device.send(Bytes(3188 + 4096, 5), 0, &room), 0) << "what the FIFO holds when the write has all";
  EXPECT_EQ(room, 0u);
  Bytes expected(16384, 5);
  std::ranges::copy(large, expected.begin() + 5196);
  std::fill_n(expected.begin(), 5196, std::uint8_t{2});
  std::fill_n(expected.begin(), 4096, std::uint8_t{1});
  EXPECT_EQ(device.sampleMemory(0, 16384), expected);
}

TEST_F(Fifo, AcquiredElementsArriveWhenReleased) {
  announce({1, 0, 8});
  ASSERT_EQ(acquire(5000, 0), 0);
  EXPECT_EQ(acquired, 4096u);
  EXPECT_EQ(room, 0u);
  std::fill_n(elements, 4096, std::uint8_t{6});
  EXPECT_EQ(send(Bytes(1)), KTSIM_E_FIFO_BUSY);
  EXPECT_EQ(release(4097), KTSIM_E_FIFO_BUSY);
  EXPECT_EQ(release(6), 0);
  EXPECT_EQ(sampleMemory(0, 1), Bytes{0}) << "nothing drains while some are acquired";
  EXPECT_EQ(release(4090), 0);
  EXPECT_EQ(sampleMemory(0, 8), Bytes(8, 6));
  EXPECT_EQ(state().fifoLevel, 4088u);
  ASSERT_EQ(acquire(8, 0) + release(8), 0);
  EXPECT_EQ(acquire(1, 4'000'000'000), KTSIM_E_TIMEOUT);
}

TEST_F(Fifo, StoppedForgetsAndOthersRefuse) {
  ASSERT_EQ(send(Bytes(10)), 0);
  ASSERT_EQ(KtFpgaDll_StopFifo(fpga.fpgaSession, fifo), 0);
  EXPECT_EQ(state().fifoLevel, 0u);
  EXPECT_EQ(KtFpgaDll_StartFifo(fpga.fpgaSession, fifo + 1), KTSIM_E_FIFO);
  std::uint8_t byte = 0;
  EXPECT_EQ(KtFpgaDll_ReadFifoU8(fpga.fpgaSession, fifo, &byte, 1, 0, nullptr), KTSIM_E_FIFO) << "not readable";
  ASSERT_EQ(ktSim_AddLoopbackFifo(fpga.fpgaSession, "echo", &fifo), 0);
  ASSERT_EQ(KtFpgaDll_StartFifo(fpga.fpgaSession, fifo), 0);
  EXPECT_EQ(KtFpgaDll_ReadFifoU8(fpga.fpgaSession, fifo, &byte, 1, 10, nullptr), KTSIM_E_TIMEOUT) << "empty";
}

// Bytes stay in the FIFO until a memory write wants them, and go to the next write in order.
TEST_F(Fifo, MemoryWritesTakeTheBytesThatTheyWant) {
  EXPECT_EQ(read(Register::kGenerationStatus), kStatusWriteComplete);
  ASSERT_EQ(send(Bytes(8, 1)) + send(Bytes(12, 2)), 0);
  EXPECT_EQ(state().fifoLevel, 20u);
  announce({1, 0, 8});
  announce({1, 64, 16});
  EXPECT_EQ(state().writeBytesMissing, 4u);
  ASSERT_EQ(send(Bytes(5, 3)), 0);
  EXPECT_EQ(state().fifoLevel, 1u);
  EXPECT_EQ(sampleMemory(0, 9), (Bytes{1, 1, 1, 1, 1, 1, 1, 1, 0}));
  EXPECT_EQ(sampleMemory(74, 6), (Bytes{2, 2, 3, 3, 3, 3}));
  announce({1, 0, 0});
  EXPECT_EQ(read(Register::kGenerationStatus), kStatusWriteComplete) << "a write of nothing is complete";
  EXPECT_EQ(counters().memoryWrites, 3u);
  EXPECT_EQ(counters().bytesReceived, 24u);

  announce({0, 16, 16});  // to sequence memory
  ASSERT_EQ(send(Bytes(15, 7)), 0);
  std::uint32_t words[8] = {};
  ASSERT_EQ(ktSim_ReadSequenceMemory(number, 0, words, 2), 0);
  EXPECT_THAT(words, testing::ElementsAre(0, 0, 0, 0, 0x07070703, 0x07070707, 0x07070707, 0x07070707));
}

TEST_F(Fifo, MemoryWritesOutsideTheMemoryAreFaultsAndNotPerformed) {
  const Announcement cases[] = {
      {1, 4096, 8},                   // behind the end
      {1, 4088, 16},      {1, 4, 8},  // not at a memory word
      {0, 1024, 16},      {1, 0xFFFFFFFFFFFFFFF8, 8},
      {1, 8, UINT64_MAX},
  };
  std::uint64_t faults = 0;
  for (const Announcement& outside : cases) {
    announce(outside);
    if (outside.elements != UINT64_MAX) {
      EXPECT_EQ(send(Bytes(outside.elements, 9)), 0) << "its bytes are swallowed";
    }
    ASSERT_EQ(deviceFaults().size(), ++faults) << outside.address;
    EXPECT_EQ(deviceFaults().back().code, KTSIM_F_WRITE_RANGE);
    EXPECT_EQ(deviceFaults().back().address, std::uint32_t{KTSIM_NO_ADDRESS});
  }
  EXPECT_THAT(deviceFaults()[1].text, testing::HasSubstr("write of 16 bytes at 4088, sample memory has 4096 bytes"));
  EXPECT_EQ(sampleMemory(0, 4096), Bytes(4096, 0));
  announce({1, 0, 8});
  EXPECT_EQ(deviceFaults().back().code, KTSIM_F_WRITE_INTERRUPTED);
  command(Command::kReset);
  EXPECT_EQ(read(Register::kGenerationStatus), kStatusWriteComplete) << "reset cancels the write";
}

}  // namespace
}  // namespace ktorba
