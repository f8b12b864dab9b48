#include <gmock/gmock.h>

#include <chrono>
#include <numeric>
#include <thread>

#include "platform/system/clock.h"
#include "platform/system/residentMemory.h"
#include "testing/SimulatedDevice.h"

namespace ktorba {
namespace {

namespace f = fetch_field;

// A ramp of 400 samples that comes again and again.
class TimeAndOutput : public testing::Test, protected SimulatedDevice {
 protected:
  TimeAndOutput() {
    fillWithRamp();
    program({instruction(Opcode::kFetch, {{f::kWordCount, 100}, {f::kMarkerMask, 2}, {f::kMarkerOffset, 9}}),
             instruction(Opcode::kJump, {{jump_field::kTargetAddress, 0}})});
  }
  std::uint64_t position() { return state().samplesPlayed; }
  std::vector<int> readOutput(std::uint64_t most) {
    std::vector<std::int16_t> samples(most);
    std::uint64_t count = 0;
    EXPECT_EQ(ktSim_ReadOutput(number, most, samples.data(), nullptr, &count), 0);
    return {samples.begin(), samples.begin() + static_cast<std::ptrdiff_t>(count)};
  }
};

TEST_F(TimeAndOutput, PassesOnceForAListOfRegisters) {
  command(Command::kInitiate);
  ASSERT_EQ(ktSim_SetAutoAdvance(number, 10), 0);
  const std::uint8_t subsystems[] = {1, 1};
  const std::uint64_t offsets[] = {0x10000 + 13, 0x10000 + 14};
  const std::uint64_t values[] = {30, 60};
  ktIFW_Target_WriteArray(fpga.ifwTarget, subsystems, offsets, values, 2, true, 1000, nullptr);
  EXPECT_EQ(position(), 10u);
}

TEST_F(TimeAndOutput, MayFollowTheWallClock) {
  ASSERT_EQ(ktSim_SetWallClock(number, 1e6), 0);
  const std::uint64_t before = platform::monotonicMilliseconds();
  command(Command::kInitiate);
  const std::uint64_t atStart = platform::monotonicMilliseconds();
  std::this_thread::sleep_for(std::chrono::milliseconds(30));
  const std::uint64_t atRead = platform::monotonicMilliseconds();
  read(Register::kGenerationStatus);
  ASSERT_EQ(ktSim_SetWallClock(number, 0), 0);
  const std::uint64_t after = platform::monotonicMilliseconds();
  EXPECT_GE(position(), (atRead - atStart) * 1000);
  EXPECT_LE(position(), (after - before) * 1000);
}

TEST_F(TimeAndOutput, IsRecordedUpToItsCapacity) {
  ASSERT_EQ(ktSim_RecordOutput(number, 100), 0);
  command(Command::kInitiate);
  ktSim_Advance(number, 50, nullptr);
  for (int first = 1; first <= 331; first += 10) {  // never more than 100 unread, many times the capacity in all
    ktSim_Advance(number, 10, nullptr);
    std::vector<int> expected(10);
    std::iota(expected.begin(), expected.end(), first);
    EXPECT_EQ(readOutput(10), expected);
  }
  ktSim_Advance(number, 60, nullptr);
  std::uint64_t waiting = 0;
  ASSERT_EQ(ktSim_ReadOutput(number, 0, nullptr, nullptr, &waiting), 0);
  EXPECT_EQ(waiting, 100u);
  EXPECT_EQ(counters().samplesLost, 10u);
  command(Command::kInitiate);
  EXPECT_TRUE(readOutput(100).empty()) << "initiate begins a new recording";
  ktSim_Advance(number, 12, nullptr);
  Bytes markers(12);
  ASSERT_EQ(ktSim_ReadOutput(number, 12, nullptr, markers.data(), &waiting), 0);
  EXPECT_EQ(markers, (Bytes{0, 0, 0, 0, 0, 0, 0, 0, 0, 2, 0, 0}));
  ASSERT_EQ(ktSim_RecordOutput(number, 0), 0);
  EXPECT_EQ(ktSim_ReadOutput(number, 1, nullptr, nullptr, &waiting), KTSIM_E_ARGUMENT);
}

TEST_F(TimeAndOutput, IsGivenToACallbackInBlocks) {
  struct Seen {
    std::vector<std::pair<std::uint64_t, std::uint64_t>> blocks;  // first sample and length
    bool isRight = true;
  } seen;
  const auto callback = [](void* user, std::uint64_t first, const void* samples, const std::uint8_t* markers,
                           std::uint64_t count) {
    Seen& to = *static_cast<Seen*>(user);
    to.blocks.emplace_back(first, count);
    for (std::uint64_t i = 0; i < count; ++i) {
      const std::uint64_t phase = (first + i) % 400;
      const int sample = static_cast<const std::int16_t*>(samples)[i];
      if (sample != static_cast<int>(phase) + 1 || markers[i] != (phase == 9 ? 2 : 0)) to.isRight = false;
    }
  };
  ASSERT_EQ(ktSim_SetOutputCallback(number, callback, &seen), 0);
  command(Command::kInitiate);
  ktSim_Advance(number, 150'000, nullptr);
  ktSim_Advance(number, 5, nullptr);
  EXPECT_THAT(seen.blocks, testing::ElementsAre(testing::Pair(0, 65536), testing::Pair(65536, 65536),
                                                testing::Pair(131072, 18928), testing::Pair(150'000, 5)));
  EXPECT_TRUE(seen.isRight);
}

TEST_F(TimeAndOutput, MemoryCostsNothingBeforeItIsWritten) {
  if (platform::residentBytes() == 0) GTEST_SKIP() << "the system does not tell";
  ktSim_Traits traits = smallTraits();
  traits.memorySizeBytes = 1u << 30;
  traits.sequenceWords = 1u << 24;
  const std::vector<std::uint8_t> megabyte(1u << 20, 1);
  const std::int64_t before = platform::residentBytes();
  std::uint32_t large = 0;
  ASSERT_EQ(ktSim_AddGenerator(fpga.fpgaSession, &traits, &large), 0);
  ASSERT_EQ(ktSim_RecordOutput(large, 1u << 30), 0);
  const std::int64_t after = platform::residentBytes();
  EXPECT_LT(after - before, 100 * 4096);
  ASSERT_EQ(ktSim_WriteSampleMemory(large, 1u << 29, megabyte.data(), megabyte.size()), 0);
  EXPECT_GT(platform::residentBytes(), after) << "what is measured moves when memory is used";
}

}  // namespace
}  // namespace ktorba
