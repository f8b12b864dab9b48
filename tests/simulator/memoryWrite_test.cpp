#include <cstring>
#include <numeric>

#include "SimulatedDevice.h"

namespace simulator_test {
namespace {

using testing::HasSubstr;

class MemoryWrite : public SimulatedDevice {};

constexpr std::uint8_t kOld = 0xEE;

// Every lead and trail of a word, in writes of one, two and three words, in every word width, sent in three pieces;
// masks and padding worked out here as a host does it.
TEST_F(MemoryWrite, EnablesTheBytesOfItsMasksAtEveryLeadAndTrail) {
  for (const std::uint32_t wordBytes : {8u, 16u, 64u}) {
    ktSim_Traits traits = smallTraits();
    traits.memoryWordBytes = wordBytes;
    if (generator != 0) {
      ASSERT_EQ(ktSim_DestroyFpga(fpga.fpgaSession), 0);
      ASSERT_EQ(ktSim_CreateFpga(&fpga), 0);
    }
    add(traits);
    for (std::uint32_t words = 1; words <= 3; ++words) {
      for (std::uint32_t lead = 0; lead < wordBytes; ++lead) {
        for (std::uint32_t trail = 0; trail < wordBytes && lead + trail < words * wordBytes; ++trail) {
          const std::uint32_t total = words * wordBytes;
          Bytes sent(total);
          std::iota(sent.begin(), sent.end(), std::uint8_t{0});
          Bytes expected(5 * wordBytes, kOld);
          ASSERT_EQ(ktSim_WriteSampleMemory(generator, 0, expected.data(), expected.size()), 0);
          std::copy(sent.begin() + lead, sent.end() - trail, expected.begin() + wordBytes + lead);
          std::uint64_t first = UINT64_MAX << lead;
          std::uint64_t last = UINT64_MAX >> (64 - (wordBytes - trail));
          if (words == 1) first = last = first & last;
          announce({1, wordBytes, total, first, last});
          EXPECT_EQ(read(Register::kGenerationStatus), 0u);
          const auto third = sent.begin() + total / 3;
          const auto middle = sent.begin() + total / 2;
          ASSERT_EQ(send({sent.begin(), third}) + send({third, middle}) + send({middle, sent.end()}), 0);
          EXPECT_EQ(read(Register::kGenerationStatus), ktorba::kStatusWriteComplete);
          ASSERT_EQ(sampleMemory(0, expected.size()), expected)
              << "word " << wordBytes << " lead " << lead << " trail " << trail << " words " << words;
        }
      }
    }
  }
  EXPECT_TRUE(deviceFaults().empty());
}

TEST_F(MemoryWrite, WithoutMaskGoesToSequenceMemoryWhole) {
  add();
  Bytes sent(32);
  std::iota(sent.begin(), sent.end(), std::uint8_t{1});
  announce({0, 16, 32, 0, 0});
  ASSERT_EQ(send(sent), 0);
  std::uint32_t words[12] = {};
  ASSERT_EQ(ktSim_ReadSequenceMemory(generator, 0, words, 3), 0);
  EXPECT_EQ(words[3], 0u);
  EXPECT_EQ(std::memcmp(words + 4, sent.data(), sent.size()), 0);
  EXPECT_EQ(sampleMemory(0, 64), Bytes(64, 0));
}

TEST_F(MemoryWrite, CountsElementsOfTheWidthInRegister27) {
  struct Case {
    std::uint32_t elementBits, bytesPerElement;
  };
  for (const Case& width : {Case{0, 4}, Case{8, 1}, Case{64, 8}, Case{256, 32}}) {
    ktSim_Traits traits = smallTraits();
    traits.downloadElementBits = width.elementBits;
    ASSERT_EQ(ktSim_DestroyFpga(fpga.fpgaSession) + ktSim_CreateFpga(&fpga), 0);
    add(traits);
    EXPECT_EQ(read(Register::kDownloadElementBits), width.elementBits);
    announce({1, 0, 2, UINT64_MAX, UINT64_MAX});
    EXPECT_EQ(state().writeBytesMissing, 2 * width.bytesPerElement);
  }
}

// Bytes stay in the FIFO until a write wants them, and go to the next write in order.
TEST_F(MemoryWrite, LeavesBytesThatItDoesNotWantInTheFifo) {
  add();
  EXPECT_EQ(read(Register::kGenerationStatus), ktorba::kStatusWriteComplete);
  ASSERT_EQ(send(Bytes(8, 1)) + send(Bytes(12, 2)), 0);
  EXPECT_EQ(state().fifoLevel, 20u);
  announce({1, 0, 8, UINT64_MAX, UINT64_MAX});
  announce({1, 64, 16, UINT64_MAX, UINT64_MAX});
  EXPECT_EQ(state().writeBytesMissing, 4u);
  ASSERT_EQ(send(Bytes(5, 3)), 0);
  EXPECT_EQ(state().fifoLevel, 1u);
  EXPECT_EQ(sampleMemory(0, 9), (Bytes{1, 1, 1, 1, 1, 1, 1, 1, 0}));
  EXPECT_EQ(sampleMemory(74, 6), (Bytes{2, 2, 3, 3, 3, 3}));
  announce({1, 0, 0, UINT64_MAX, UINT64_MAX});
  EXPECT_EQ(read(Register::kGenerationStatus), ktorba::kStatusWriteComplete) << "a write of nothing is complete";
  EXPECT_EQ(counters().memoryWrites, 3u);
  EXPECT_EQ(counters().bytesReceived, 24u);
}

TEST_F(MemoryWrite, OutsideTheMemoryIsAFaultAndNotPerformed) {
  add();
  const Announcement cases[] = {
      {1, 1024, 8},                   // behind the end
      {1, 1016, 16},      {1, 4, 8},  // not at a memory word
      {0, 512, 16},       {1, 0xFFFFFFFFFFFFFFF8, 8},
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
  EXPECT_THAT(deviceFaults()[1].text, HasSubstr("write of 16 bytes at 1016, sample memory has 1024 bytes"));
  EXPECT_EQ(sampleMemory(0, 1024), Bytes(1024, 0));
  announce({1, 0, 8, UINT64_MAX, UINT64_MAX});
  EXPECT_EQ(deviceFaults().back().code, KTSIM_F_WRITE_INTERRUPTED);
  command(Command::kReset);
  EXPECT_EQ(read(Register::kGenerationStatus), ktorba::kStatusWriteComplete) << "reset cancels the write";
}

TEST_F(MemoryWrite, HeldNeverCompletes) {
  add();
  ktSim_HoldMemoryWrites(generator, true);
  announce({1, 0, 8, UINT64_MAX, UINT64_MAX});
  ASSERT_EQ(send(Bytes(8, 7)), 0);
  EXPECT_EQ(read(Register::kGenerationStatus), 0u);
  EXPECT_EQ(sampleMemory(0, 8), Bytes(8, 7));
  ktSim_HoldMemoryWrites(generator, false);
  EXPECT_EQ(read(Register::kGenerationStatus), ktorba::kStatusWriteComplete);
}

}  // namespace
}  // namespace simulator_test
