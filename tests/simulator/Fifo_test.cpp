#include <algorithm>

#include "SimulatedDevice.h"
#include "platform/KtFpga.h"

namespace simulator_test {
namespace {

class Fifo : public SimulatedDevice {
 protected:
  std::uint64_t configure(std::uint64_t depth) {
    std::uint64_t actual = 0;
    EXPECT_EQ(KtFpgaDll_ConfigureFifo2(fpga.fpgaSession, fifo, depth, &actual), 0);
    EXPECT_EQ(KtFpgaDll_StartFifo(fpga.fpgaSession, fifo), 0);
    return actual;
  }
};

TEST_F(Fifo, DepthIsRoundedUpToBlocks) {
  add();
  EXPECT_EQ(configure(40960), 40960u);
  EXPECT_EQ(configure(40961), 45056u);
  EXPECT_EQ(configure(0), 4096u);
  std::uint64_t actual = 0;
  for (const std::uint64_t huge : {UINT64_MAX, UINT64_MAX - 5000, std::uint64_t{1} << 60}) {
    EXPECT_LT(KtFpgaDll_ConfigureFifo2(fpga.fpgaSession, fifo, huge, &actual), 0) << huge;
  }
  EXPECT_EQ(state().fifoDepth, 4096u);
}

TEST_F(Fifo, WriteThatCannotDrainTimesOutWithoutEffect) {
  add();
  configure(4096);
  std::uint64_t room = 0;
  EXPECT_EQ(send(Bytes(4000), 5, &room), 0);
  EXPECT_EQ(room, 96u);
  EXPECT_EQ(send(Bytes(97), 4'000'000'000, &room), KTSIM_E_TIMEOUT);
  EXPECT_EQ(room, 96u);
  EXPECT_EQ(send({}, 0, &room), 0) << "writing nothing tells the room";
  EXPECT_EQ(send(Bytes(96), 0, &room), 0);
  EXPECT_EQ(room, 0u);
  EXPECT_EQ(send({}, 0, &room), 0);
}

// 4096 + 1000 bytes into a memory write, 100 bytes per millisecond: the overflow needs 10 ms of waiting.
TEST_F(Fifo, ThrottledDrainTakesTheTimeThatAWriteWaits) {
  ktSim_Traits traits = smallTraits();
  traits.memorySizeBytes = 1 << 20;
  add(traits);
  configure(4096);
  ASSERT_EQ(ktSim_SetDrainRate(generator, 100), 0);
  announce({1, 0, 8192, UINT64_MAX, UINT64_MAX});
  Bytes sent(8192);
  for (std::size_t i = 0; i < sent.size(); ++i) sent[i] = static_cast<std::uint8_t>(i * 7 / 3);
  std::uint64_t room = 0;
  ASSERT_EQ(send({sent.begin(), sent.begin() + 4096}, 1, &room), 0);
  EXPECT_EQ(room, 0u);
  // Each try drains 100 bytes before it, too.
  EXPECT_EQ(send({sent.begin() + 4096, sent.begin() + 5196}, 9, &room), KTSIM_E_TIMEOUT);
  EXPECT_EQ(room, 1000u);
  EXPECT_EQ(send({sent.begin() + 4096, sent.begin() + 5196}, 0, &room), 0);
  EXPECT_EQ(room, 0u);
  EXPECT_EQ(send({sent.begin() + 5196, sent.end()}, 30, &room), 0);
  ASSERT_EQ(ktSim_SetDrainRate(generator, KTSIM_DRAIN_AT_ONCE), 0);
  EXPECT_EQ(sampleMemory(0, 8192), sent);
  EXPECT_EQ(read(Register::kGenerationStatus), ktorba::kStatusWriteComplete);

  ASSERT_EQ(ktSim_SetDrainRate(generator, 0), 0);
  announce({1, 0, 8192, UINT64_MAX, UINT64_MAX});
  EXPECT_EQ(send(Bytes(4097), 4'000'000'000, &room), KTSIM_E_TIMEOUT);
  ASSERT_EQ(ktSim_SetDrainRate(generator, KTSIM_DRAIN_AT_ONCE), 0);
  EXPECT_EQ(send(Bytes(8192 + 4096), 0, &room), 0) << "larger than the FIFO, drained as it comes";
  EXPECT_EQ(room, 0u);
}

TEST_F(Fifo, AcquiredElementsArriveWhenReleased) {
  add();
  configure(4096);
  announce({1, 0, 8, UINT64_MAX, UINT64_MAX});
  std::uint8_t* elements = nullptr;
  std::uint64_t acquired = 0;
  std::uint64_t room = 0;
  const auto acquire = [&](std::uint64_t count, std::uint32_t timeoutMs) {
    return KtFpgaDll_AcquireFifoWriteElementsU8(fpga.fpgaSession, fifo, &elements, count, timeoutMs, &acquired, &room);
  };
  ASSERT_EQ(acquire(5000, 0), 0);
  EXPECT_EQ(acquired, 4096u);
  EXPECT_EQ(room, 0u);
  std::fill_n(elements, 4096, std::uint8_t{6});
  EXPECT_EQ(send(Bytes(1)), KTSIM_E_FIFO_BUSY);
  EXPECT_EQ(KtFpgaDll_ReleaseFifoElements(fpga.fpgaSession, fifo, 4097), KTSIM_E_FIFO_BUSY);
  EXPECT_EQ(KtFpgaDll_ReleaseFifoElements(fpga.fpgaSession, fifo, 6), 0);
  EXPECT_EQ(sampleMemory(0, 1), Bytes{0}) << "nothing drains while some are acquired";
  EXPECT_EQ(KtFpgaDll_ReleaseFifoElements(fpga.fpgaSession, fifo, 4090), 0);
  EXPECT_EQ(sampleMemory(0, 8), Bytes(8, 6));
  EXPECT_EQ(state().fifoLevel, 4088u);
  ASSERT_EQ(acquire(8, 0), 0);
  ASSERT_EQ(KtFpgaDll_ReleaseFifoElements(fpga.fpgaSession, fifo, 8), 0);
  EXPECT_EQ(acquire(1, 4'000'000'000), KTSIM_E_TIMEOUT);
}

TEST_F(Fifo, StoppedRefusesAndForgets) {
  add();
  ASSERT_EQ(send(Bytes(10)), 0);
  ASSERT_EQ(KtFpgaDll_StopFifo(fpga.fpgaSession, fifo), 0);
  EXPECT_EQ(state().fifoLevel, 0u);
  EXPECT_EQ(send(Bytes(10)), KTSIM_E_FIFO_STOPPED);
  EXPECT_EQ(KtFpgaDll_StartFifo(fpga.fpgaSession, fifo + 1), KTSIM_E_FIFO);
  std::uint8_t byte = 0;
  EXPECT_EQ(KtFpgaDll_ReadFifoU8(fpga.fpgaSession, fifo, &byte, 1, 0, nullptr), KTSIM_E_FIFO) << "not readable";
}

TEST_F(Fifo, LoopbackGivesBackWhatWasWritten) {
  ASSERT_EQ(ktSim_AddLoopbackFifo(fpga.fpgaSession, "echo", &fifo), 0);
  ASSERT_EQ(KtFpgaDll_StartFifo(fpga.fpgaSession, fifo), 0);
  Bytes got(200 * 90);
  std::uint64_t left = 0;
  for (std::uint8_t round = 0; round < 200; ++round) {  // many times the depth in all
    ASSERT_EQ(send(Bytes(101, round)), 0);
    ASSERT_EQ(KtFpgaDll_ReadFifoU8(fpga.fpgaSession, fifo, got.data() + round * 90, 90, 0, &left), 0);
  }
  for (std::size_t i = 0; i < got.size(); ++i) ASSERT_EQ(got[i], i / 101);
  std::uint8_t* elements = nullptr;
  std::uint64_t acquired = 0;
  ASSERT_EQ(KtFpgaDll_AcquireFifoReadElementsU8(fpga.fpgaSession, fifo, &elements, 9999, 0, &acquired, &left), 0);
  EXPECT_EQ(acquired, 200u * 11);
  EXPECT_EQ(elements[2199], 199);
  ASSERT_EQ(KtFpgaDll_ReleaseFifoElements(fpga.fpgaSession, fifo, 2200), 0);
  EXPECT_EQ(KtFpgaDll_ReadFifoU8(fpga.fpgaSession, fifo, got.data(), 1, 10, &left), KTSIM_E_TIMEOUT);
}

}  // namespace
}  // namespace simulator_test
