#include <gmock/gmock.h>

#include "testing/Record.h"
#include "testing/SimulatedDevice.h"

namespace ktorba {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;

class Framework : public testing::Test, protected SimulatedDevice {
 protected:
  std::vector<std::uint32_t> children(std::uint32_t of, std::uint32_t capacity = 100) {
    std::vector<std::uint32_t> numbers(capacity);
    std::uint32_t count = 0;
    ktIFW_Context_GetAllChildren(fpga.ifwSession, of, numbers.data(), capacity, &count, nullptr);
    numbers.resize(count);
    return numbers;
  }
};

TEST_F(Framework, TreeMayTakeAnyShape) {
  EXPECT_THAT(children(0), ElementsAre(fpga.parentContext));
  std::uint32_t a = 0;
  std::uint32_t b = 0;
  ASSERT_EQ(ktSim_AddContext(fpga.fpgaSession, 0, 7, &a), 0);
  ASSERT_EQ(ktSim_AddContext(fpga.fpgaSession, a, 8, &b), 0);
  ASSERT_EQ(ktSim_ListContext(fpga.fpgaSession, b, 0), 0);
  ASSERT_EQ(ktSim_ListContext(fpga.fpgaSession, 0, b), 0);
  EXPECT_THAT(children(0), ElementsAre(fpga.parentContext, a, b));
  EXPECT_THAT(children(b), ElementsAre(0u));
  EXPECT_EQ(ktSim_AddContext(fpga.fpgaSession, 99, 0, &b), KTSIM_E_CONTEXT);
  std::uint32_t child[2] = {};
  std::uint32_t count = 0;
  ktIFW_Context_GetChildrenByUid(fpga.ifwSession, 0, 8, child, 2, &count, nullptr);
  EXPECT_EQ(count, 1u);
  EXPECT_EQ(child[0], b);
  EXPECT_EQ(children(0, 2).size(), 3u) << "the true count, whatever the capacity";

  ASSERT_EQ(ktSim_ChangeChildrenAfterCount(fpga.fpgaSession, 0, 2), 0);
  EXPECT_EQ(children(0, 1).size(), 3u) << "not a count";
  EXPECT_EQ(children(0, 0).size(), 3u);
  EXPECT_EQ(children(0).size(), 5u);
  ASSERT_EQ(ktSim_ChangeChildrenAfterCount(fpga.fpgaSession, 0, -9), 0);
  EXPECT_EQ(children(0, 0).size(), 5u);
  EXPECT_TRUE(children(0).empty());
}

TEST_F(Framework, GeneratorsHaveTheNumbersAskedForAndTheirOwnRegisters) {
  ktSim_Traits traits = smallTraits();
  traits.instance = 9;
  traits.downloadFifoNumber = 3;
  add(traits);
  std::uint32_t child = 0;
  Record status;
  ktIFW_Context_GetChild(fpga.ifwSession, 101, 9, fpga.parentContext, &child, &status);
  EXPECT_EQ(status.code, 0);
  std::uint16_t info[4] = {};
  ktIFW_Context_GetInfo(fpga.ifwSession, child, info, info + 1, info + 2, info + 3, &status);
  EXPECT_THAT(info, ElementsAre(101, 4, 3, 9));
  ktIFW_Context_GetChild(fpga.ifwSession, 101, 1, fpga.parentContext, &child, &status);
  EXPECT_EQ(status.code, KTSIM_E_CHILD);
  EXPECT_THAT(status.json, HasSubstr(R"("component": "ktsim", "reason": "the context has no such child")"));
  std::uint32_t secondFifo = 0;
  EXPECT_EQ(KtFpgaDll_FindFifoPrivate(fpga.fpgaSession, "wfm gen.download fifo 3", 0xFFFFFFFF, &secondFifo), 0);
  EXPECT_EQ(secondFifo, 1u);
  std::uint64_t fifoNumber = 0;
  EXPECT_EQ(read(Register::kDownloadFifoNumber, fifoNumber, 2), 0);
  EXPECT_EQ(fifoNumber, 3u);
  EXPECT_EQ(write(Register::kCommand, 2, 2), 0);
  EXPECT_FALSE(state().running) << "only the second was told";
}

TEST_F(Framework, RegistersAnswerInTheirDirectionAlone) {
  std::uint64_t value = 0;
  for (const bool hasStreaming : {true, false}) {
    ktSim_Traits traits = smallTraits();
    traits.hasStreamingRegisters = hasStreaming;
    SimulatedDevice device(traits);
    for (const RegisterInfo& info : kRegisters) {
      const bool isThere =
          hasStreaming || info.number < Register::kStreamingStartWord || info.number == Register::kDownloadElementBits;
      const bool isRead = info.access == RegisterAccess::Read;
      EXPECT_EQ(device.read(info.number, value), isThere && isRead ? 0 : KTSIM_E_REGISTER) << info.name;
      EXPECT_EQ(device.write(info.number, 1), isThere && !isRead ? 0 : KTSIM_E_REGISTER) << info.name;
    }
  }
  EXPECT_EQ(write(Register{6}, 1), KTSIM_E_REGISTER);
  EXPECT_EQ(write(Register::kCommand, 1, 2), KTSIM_E_REGISTER) << "of no generator";
}

TEST_F(Framework, CallsFailOnDemandWithAnElaboration) {
  ASSERT_EQ(ktSim_FailCall(fpga.fpgaSession, "ktIFW_Target_Reset", 1, -5, R"({"file": "mine", "line": 3})"), 0);
  Record status;
  ktIFW_Target_Reset(fpga.ifwTarget, &status);
  EXPECT_EQ(status.code, -5);
  EXPECT_STREQ(status.json, R"({"file": "mine", "line": 3})");
  ktIFW_Target_Write(fpga.ifwTarget, 1, 0x10007, 2, true, 0, &status);
  EXPECT_FALSE(state().running) << "a status with an error lets nothing happen";
}

TEST_F(Framework, AcquiredFifoElementsArriveWhenReleased) {
  std::uint8_t* elements = nullptr;
  std::uint64_t acquired = 0, room = 0;
  const auto acquire = [&](std::uint64_t count, std::uint32_t timeoutMs) {
    return KtFpgaDll_AcquireFifoWriteElementsU8(fpga.fpgaSession, fifo, &elements, count, timeoutMs, &acquired, &room);
  };
  const auto release = [&](std::uint64_t count) {
    return KtFpgaDll_ReleaseFifoElements(fpga.fpgaSession, fifo, count);
  };
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
  std::uint8_t byte = 0;
  EXPECT_EQ(KtFpgaDll_ReadFifoU8(fpga.fpgaSession, fifo, &byte, 1, 0, nullptr), KTSIM_E_FIFO) << "not readable";
  ASSERT_EQ(ktSim_AddLoopbackFifo(fpga.fpgaSession, "echo", &fifo), 0);
  ASSERT_EQ(KtFpgaDll_StartFifo(fpga.fpgaSession, fifo), 0);
  EXPECT_EQ(KtFpgaDll_ReadFifoU8(fpga.fpgaSession, fifo, &byte, 1, 10, nullptr), KTSIM_E_TIMEOUT) << "empty";
}

TEST_F(Framework, UnknownNumbersAndValuesOutOfRangeAreRefused) {
  std::uint32_t found = 0;
  std::uint32_t signature[5] = {1, 1, 1, 1, 1};
  std::uint32_t count = 5;
  EXPECT_EQ(KtFpgaDll_GetBitfileSignature(fpga.fpgaSession, signature, &count), 0);
  EXPECT_EQ(signature[4], 1u) << "it has four numbers";
  EXPECT_EQ(KtFpgaDll_StartFifo(fpga.ifwSession, fifo), KTSIM_E_SESSION);
  Record status;
  ktIFW_Target_Reset(fpga.ifwSession, &status);
  EXPECT_EQ(status.code, KTSIM_E_SESSION);
  EXPECT_EQ(KtFpgaDll_FindFifoPrivate(fpga.fpgaSession, nullptr, 0xFFFFFFFF, &found), KTSIM_E_ARGUMENT);
  EXPECT_EQ(KtFpgaDll_FindFifoPrivate(fpga.fpgaSession, "wfm gen.download fifo 0", 1, &found), KTSIM_E_NAME);
  EXPECT_EQ(ktSim_Advance(0, 1, nullptr), KTSIM_E_GENERATOR);
  EXPECT_EQ(ktSim_Advance(number + 1, 1, nullptr), KTSIM_E_GENERATOR);
  EXPECT_EQ(ktSim_ReadSampleMemory(number, UINT64_MAX, signature, 2), KTSIM_E_ARGUMENT);
  EXPECT_EQ(ktSim_WriteSequenceMemory(number, UINT64_MAX / 16 + 1, signature, 1), KTSIM_E_ARGUMENT);
  EXPECT_EQ(ktSim_RecordOutput(number, UINT64_MAX), KTSIM_E_MEMORY);
  EXPECT_EQ(ktSim_SetWallClock(number, -1), KTSIM_E_ARGUMENT);
  const std::pair<std::uint32_t ktSim_Traits::*, std::uint32_t> traitsOutOfRange[] = {
      {&ktSim_Traits::sampleWidthBits, 24},    {&ktSim_Traits::sampleWidthBits, 0}, {&ktSim_Traits::memoryWordBytes, 7},
      {&ktSim_Traits::memoryWordBytes, 66},    {&ktSim_Traits::memoryWordBytes, 9}, {&ktSim_Traits::sequenceWords, 0},
      {&ktSim_Traits::downloadElementBits, 12}};
  for (const auto& [member, value] : traitsOutOfRange) {
    ktSim_Traits traits = smallTraits();
    traits.*member = value;
    EXPECT_EQ(ktSim_AddGenerator(fpga.fpgaSession, &traits, &found), KTSIM_E_ARGUMENT) << value;
  }
  ktSim_Traits least, greatest;
  ktSim_TraitLimits(&least, &greatest);
  greatest.memorySizeBytes = 1u << 20;
  for (const ktSim_Traits& limit : {least, greatest}) {
    EXPECT_EQ(ktSim_AddGenerator(fpga.fpgaSession, &limit, &found), 0);
  }
  ++greatest.sequenceWords;
  EXPECT_EQ(ktSim_AddGenerator(fpga.fpgaSession, &greatest, &found), KTSIM_E_ARGUMENT);
  EXPECT_STREQ(ktSim_DescribeCode(0), "success");
}

}  // namespace
}  // namespace ktorba
