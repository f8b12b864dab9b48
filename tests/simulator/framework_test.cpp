#include <algorithm>

#include "SimulatedDevice.h"
#include "platform/KtFpga.h"
#include "platform/ktifwu.h"

namespace simulator_test {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;

class Framework : public SimulatedDevice {
 protected:
  std::vector<std::uint32_t> children(std::uint32_t of, std::uint32_t capacity = 100) {
    std::vector<std::uint32_t> numbers(capacity);
    std::uint32_t count = 0;
    ktIFW_Context_GetAllChildren(fpga.ifwSession, of, numbers.data(), capacity, &count, nullptr);
    numbers.resize(count);
    return numbers;
  }
  std::pair<bool, bool> check(std::uint16_t major, std::uint16_t minor) {
    bool first = true;
    bool second = true;
    ktIFW_Context_CheckVersion(fpga.ifwSession, context, major, minor, false, &first, &second, nullptr);
    return {first, second};
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

TEST_F(Framework, VersionIsOlderNewerOrFits) {
  using Flags = std::pair<bool, bool>;
  struct Case {
    std::uint16_t major, minor;
    Flags for42, for43;
  };
  for (const Case& block : {Case{4, 3, {false, false}, {false, false}}, Case{4, 2, {false, false}, {true, false}},
                            Case{4, 9, {false, false}, {false, false}}, Case{4, 1, {true, false}, {true, false}},
                            Case{3, 9, {true, false}, {true, false}}, Case{5, 0, {false, true}, {false, true}}}) {
    ktSim_Traits traits = smallTraits();
    traits.versionMajor = block.major;
    traits.versionMinor = block.minor;
    ASSERT_EQ(ktSim_DestroyFpga(fpga.fpgaSession) + ktSim_CreateFpga(&fpga), 0);
    add(traits);
    EXPECT_EQ(check(4, 2), block.for42) << block.major << "." << block.minor;
    EXPECT_EQ(check(4, 3), block.for43) << block.major << "." << block.minor;
  }
}

TEST_F(Framework, ManyGeneratorsEachHaveTheirOwn) {
  add();
  ktSim_Traits traits = smallTraits();
  traits.instance = 9;
  traits.downloadFifoNumber = 3;
  traits.minFetchSamples = 33;
  traits.reportedType = 102;
  std::uint32_t second = 0;
  ASSERT_EQ(ktSim_AddGenerator(fpga.fpgaSession, &traits, &second), 0);
  std::uint32_t first = context;
  const auto getChild = [&](std::uint8_t instance) {
    return ask([&](tStatus* status) {
      ktIFW_Context_GetChild(fpga.ifwSession, 101, instance, fpga.parentContext, &context, status);
    });
  };
  const Answer missing = getChild(1);
  EXPECT_EQ(missing.code, KTSIM_E_CHILD);
  EXPECT_THAT(missing.json, HasSubstr(R"("component": "ktsim", "reason": "the context has no such child")"));
  ASSERT_EQ(getChild(9).code, 0);
  EXPECT_EQ(read(Register::kMinFetchSamples), 33u);
  EXPECT_EQ(read(Register::kDownloadFifoNumber), 3u);
  std::uint16_t info[4] = {};
  ktIFW_Context_GetInfo(fpga.ifwSession, context, info, info + 1, info + 2, info + 3, nullptr);
  EXPECT_THAT(info, ElementsAre(102, 4, 3, 9));
  std::uint32_t number = 0;
  ASSERT_EQ(KtFpgaDll_FindFifoPrivate(fpga.fpgaSession, "wfm gen.download fifo 3", 0xFFFFFFFF, &number), 0);
  EXPECT_EQ(number, 1u);
  EXPECT_EQ(KtFpgaDll_FindFifoPrivate(fpga.fpgaSession, "wfm gen.download fifo 1", 0xFFFFFFFF, &number), KTSIM_E_NAME);

  command(Command::kInitiate);
  EXPECT_FALSE(state().running) << "only the second was told";
  std::swap(generator, second);
  EXPECT_TRUE(state().running);
  context = first;
  EXPECT_EQ(read(Register::kMinFetchSamples), 4u);
}

TEST_F(Framework, RegistersAnswerInTheirDirectionAlone) {
  add();
  for (const ktorba::RegisterInfo& info : ktorba::kRegisters) {
    std::uint64_t value = 0;
    const Answer got = ask([&](tStatus* status) {
      ktIFW_Target_Read(fpga.ifwTarget, 1, 0x10000 + static_cast<std::uint64_t>(info.number), &value, 0, status);
    });
    const bool isRead = info.access == ktorba::RegisterAccess::Read;
    EXPECT_EQ(got.code, isRead ? 0 : KTSIM_E_REGISTER) << info.name;
    EXPECT_EQ(write(info.number, 1).code, isRead ? KTSIM_E_REGISTER : 0) << info.name;
  }
  EXPECT_EQ(write(Register{6}, 1).code, KTSIM_E_REGISTER);
  EXPECT_EQ(write(Register::kCommand, 3).code, KTSIM_E_COMMAND);
  EXPECT_EQ(ask([&](tStatus* status) { ktIFW_Target_Write(fpga.ifwTarget, 2, 7, 1, true, 0, status); }).code,
            KTSIM_E_REGISTER);
  EXPECT_EQ(ask([&](tStatus* status) { ktIFW_Target_Reset(fpga.ifwSession, status); }).code, KTSIM_E_SESSION);
  ktSim_OverrideRegister(generator, 1, 24);
  EXPECT_EQ(read(Register::kSampleWidthBits), 24u);
  ktSim_RestoreRegister(generator, 1);
  EXPECT_EQ(read(Register::kSampleWidthBits), 16u);
  EXPECT_EQ(ktSim_OverrideRegister(generator, 6, 0), KTSIM_E_REGISTER);
}

TEST_F(Framework, CallsAreRecordedInOrder) {
  add();
  std::uint32_t second = 0;
  ASSERT_EQ(ktSim_AddGenerator(fpga.fpgaSession, nullptr, &second), 0);
  ASSERT_EQ(ktSim_RecordCalls(fpga.fpgaSession, 6), 0);
  std::uint64_t actual = 0;
  KtFpgaDll_ConfigureFifo2(fpga.fpgaSession, fifo, 40960, &actual);
  KtFpgaDll_WriteFifoU8(fpga.fpgaSession, fifo, nullptr, 0, 17, &actual);
  const std::uint8_t subsystems[] = {1, 2};
  const std::uint64_t offsets[] = {0x10000 + 10, 0x20000 + 7};
  const std::uint64_t values[] = {4096, 2};
  std::uint64_t read[2] = {};
  ktIFW_Target_WriteArray(fpga.ifwTarget, subsystems, offsets, values, 2, true, 1000, nullptr);
  ktIFW_Target_Read(fpga.ifwTarget, 2, 0x20000 + 17, read, 1000, nullptr);
  ktIFW_Context_CheckVersion(fpga.ifwSession, context, 4, 2, false, nullptr, nullptr, nullptr);
  KtFpgaDll_FindFifoPrivate(fpga.fpgaSession, "none", 0xFFFFFFFF, &second);
  KtFpgaDll_StartFifo(fpga.fpgaSession, fifo);
  EXPECT_EQ(calls(),
            "KtFpgaDll_ConfigureFifo2 fifo=0 depth=40960\n"
            "KtFpgaDll_WriteFifoU8 fifo=0 count=0 = -70007\n"
            "write 10 <- 4096, 1:7 <- 2\n"
            "read 1:17\n"
            "ktIFW_Context_CheckVersion context=2 major=4 minor=2 flag=0\n"
            "KtFpgaDll_FindFifoPrivate name=none typeFilter=4294967295 = -70005\n");
  EXPECT_EQ(calls(), "");
  std::uint64_t count = 0;
  ASSERT_EQ(ktSim_GetCallCount(fpga.fpgaSession, &count), 0);
  EXPECT_EQ(count, 10u);
}

TEST_F(Framework, CallsFailOnDemand) {
  add();
  const auto start = [&] { return KtFpgaDll_StartFifo(fpga.fpgaSession, fifo); };
  const auto stop = [&] { return KtFpgaDll_StopFifo(fpga.fpgaSession, fifo); };
  ASSERT_EQ(ktSim_FailCall(fpga.fpgaSession, "KtFpgaDll_StopFifo", 2, -61, nullptr), 0);
  ASSERT_EQ(ktSim_FailCall(fpga.fpgaSession, nullptr, 5, 77, nullptr), 0);
  EXPECT_EQ(stop(), 0);
  EXPECT_EQ(start(), 0);
  EXPECT_EQ(stop(), -61);
  EXPECT_EQ(send(Bytes(1)), 0) << "the failed stop did nothing";
  EXPECT_EQ(stop(), 77) << "a warning comes after the call was carried out";
  EXPECT_EQ(send(Bytes(1)), KTSIM_E_FIFO_STOPPED);
  EXPECT_EQ(stop(), 0);

  ASSERT_EQ(ktSim_FailCall(fpga.fpgaSession, "ktIFW_Target_Write", 1, -5, R"({"file": "mine", "line": 3})"), 0);
  const Answer answer = write(Register::kCommand, 2);
  EXPECT_EQ(answer.code, -5);
  EXPECT_EQ(answer.json, R"({"file": "mine", "line": 3})");
  EXPECT_FALSE(state().running);
  ASSERT_EQ(ktSim_FailCall(fpga.fpgaSession, "KtFpgaDll_StartFifo", 1, 0, nullptr), 0);
  ASSERT_EQ(ktSim_FailCall(fpga.fpgaSession, nullptr, 1, -7, nullptr), 0);
  ASSERT_EQ(ktSim_FailCall(fpga.fpgaSession, nullptr, 2, -8, nullptr), 0);
  EXPECT_EQ(start(), KTSIM_E_FAULT);
  ASSERT_EQ(ktSim_ClearFailures(fpga.fpgaSession), 0);
  EXPECT_EQ(start(), 0);

  tStatus failed{-9, 0, nullptr, nullptr};
  ktIFW_Target_Write(fpga.ifwTarget, 1, 0x10007, 2, true, 0, &failed);
  EXPECT_EQ(failed.code, -9);
  EXPECT_FALSE(state().running) << "a status with an error lets nothing happen";
}

TEST_F(Framework, UnknownNumbersAndNullPointersAreRefused) {
  add();
  std::uint32_t number = 0;
  std::uint32_t signature[5] = {1, 1, 1, 1, 1};
  std::uint32_t count = 5;
  EXPECT_EQ(KtFpgaDll_GetBitfileSignature(fpga.fpgaSession, signature, &count), 0);
  EXPECT_EQ(count, 4u);
  EXPECT_EQ(signature[4], 1u);
  EXPECT_EQ(KtFpgaDll_StartFifo(fpga.ifwSession, fifo), KTSIM_E_SESSION);
  EXPECT_EQ(KtFpgaDll_FindFifoPrivate(fpga.fpgaSession, nullptr, 0xFFFFFFFF, &number), KTSIM_E_ARGUMENT);
  ASSERT_EQ(ktSim_AddRegisterName(fpga.fpgaSession, "reg", 0x44), 0);
  EXPECT_EQ(KtFpgaDll_FindRegisterPrivate(fpga.fpgaSession, "reg", 0xFFFFFFFF, &number), 0);
  EXPECT_EQ(number, 0x44u);
  EXPECT_EQ(KtFpgaDll_FindRegisterPrivate(fpga.fpgaSession, "reg", 1, &number), KTSIM_E_NAME);
  EXPECT_EQ(ktSim_Advance(0, 1, nullptr), KTSIM_E_GENERATOR);
  EXPECT_EQ(ktSim_Advance(generator + 1, 1, nullptr), KTSIM_E_GENERATOR);
  EXPECT_EQ(ktSim_ReadSampleMemory(generator, UINT64_MAX, signature, 2), KTSIM_E_ARGUMENT);
  EXPECT_EQ(ktSim_WriteSequenceMemory(generator, UINT64_MAX / 16 + 1, signature, 1), KTSIM_E_ARGUMENT);
  EXPECT_EQ(ktSim_RecordOutput(generator, UINT64_MAX), KTSIM_E_MEMORY);
  EXPECT_EQ(ktSim_SetWallClock(generator, -1), KTSIM_E_ARGUMENT);
  for (const auto& [member, value] :
       {std::pair{&ktSim_Traits::sampleWidthBits, 24u}, std::pair{&ktSim_Traits::sampleWidthBits, 0u},
        std::pair{&ktSim_Traits::memoryWordBytes, 7u}, std::pair{&ktSim_Traits::memoryWordBytes, 66u},
        std::pair{&ktSim_Traits::memoryWordBytes, 9u}, std::pair{&ktSim_Traits::sequenceWords, 0u},
        std::pair{&ktSim_Traits::downloadElementBits, 12u}}) {
    ktSim_Traits traits = defaultTraits();
    traits.*member = value;
    EXPECT_EQ(ktSim_AddGenerator(fpga.fpgaSession, &traits, &number), KTSIM_E_ARGUMENT) << value;
  }
  EXPECT_STREQ(ktSim_DescribeCode(0), "success");
}

// Hosts refuse FPGA sessions with bit 13, so none is ever given.
TEST(FpgaNumbers, LeaveBit13ClearAndDiffer) {
  std::uint32_t last = 0;
  for (int i = 0; i < 9000; ++i) {
    ktSim_Fpga fpga;
    ASSERT_EQ(ktSim_CreateFpga(&fpga), 0);
    ASSERT_TRUE((fpga.fpgaSession & 0x2000) == 0 && fpga.fpgaSession > last);
    last = fpga.fpgaSession;
    ASSERT_EQ(ktSim_DestroyFpga(last), 0);
  }
}

}  // namespace
}  // namespace simulator_test
