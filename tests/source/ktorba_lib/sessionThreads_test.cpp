// Sessions are independent: eight of them, worked hard on two threads, on one FPGA while others come and go. For the
// thread sanitizer above all.
#include <gtest/gtest.h>

#include <thread>
#include <vector>

#include "testing/SimulatedGenerator.h"

namespace {

constexpr std::size_t kSessionsPerThread = 4;
constexpr std::size_t kRounds = 25;

// Plays a waveform that no other session writes, and tells whether it was played right.
bool playOnce(const SimulatedGenerator& fpga, std::uint32_t generator, std::uint8_t instance, std::int16_t value) {
  const SimulatedGenerator another;
  std::uint32_t session = 0;
  std::uint8_t isDone = 0;
  std::uint64_t played = 0;
  const std::vector<std::int16_t> written(1000, value);
  std::vector<std::int16_t> output(1000 + 2 * 64);
  const bool succeeded =
      fpga.open(session, instance) == 0 &&
      ktORBA_WriteWaveformI16(session, "w", written.data(), 1000, 20000, nullptr) == 0 &&
      ktORBA_WriteScript(session, "script s generate w end script", nullptr) == 0 &&
      ktORBA_SelectActiveScript(session, "s", nullptr) == 0 && ktORBA_StartGeneration(session, nullptr) == 0 &&
      ktSim_AdvanceInto(generator, output.size(), output.data(), nullptr, &played) == 0 &&
      ktORBA_CheckGenerationStatus(session, &isDone, nullptr) == 0 && ktORBA_Reset(session, nullptr) == 0;
  return ktORBA_CloseOrbaSession(session, nullptr) == 0 && succeeded && isDone == 1 &&
         std::equal(written.begin(), written.end(), output.begin() + 64);
}

TEST(SessionThreads, EightSessionsOnTwoThreadsDoNotDisturbEachOther) {
  SimulatedGenerator fpga(defaultTraits());
  std::vector<std::uint32_t> generators{fpga.number};
  while (generators.size() < 2 * kSessionsPerThread) generators.push_back(fpga.add());
  const auto work = [&](std::size_t first) {
    for (std::size_t i = 0; i < kRounds * kSessionsPerThread; ++i) {
      const std::size_t index = first + i % kSessionsPerThread;
      EXPECT_TRUE(
          playOnce(fpga, generators[index], static_cast<std::uint8_t>(index), static_cast<std::int16_t>(i + 1)));
    }
  };
  std::thread one(work, 0), other(work, kSessionsPerThread);
  one.join();
  other.join();
}

}  // namespace
