// The engine's rules and what its failures leave behind, through the exported functions. Where samples land and what
// plays is tested in tests/endToEnd, the platform calls of each operation in tests/source/ktorba_lib.
#include <gmock/gmock.h>

#include <functional>

#include "testing/Record.h"
#include "testing/SimulatedGenerator.h"

namespace {

using testing::HasSubstr;

class HWControlTest : public testing::Test {
 protected:
  ~HWControlTest() override {
    ktORBA_CloseOrbaSession(session, nullptr);  // not open in every test
  }

  std::int32_t open() { return generator.open(session, 0, &status); }
  std::int32_t allocate(const char* name, std::uint32_t n) {
    return ktORBA_AllocateWaveform(session, name, n, &status);
  }
  std::int32_t write(const char* name, std::uint32_t count, std::int32_t timeoutMs = 10000) {
    return ktORBA_WriteWaveformI16(session, name, samples.data(), count, timeoutMs, &status);
  }
  std::int32_t move(std::uint32_t offset, std::uint8_t mode) {
    return ktORBA_SetWaveformNextWritePosition(session, "W", offset, mode, &status);
  }
  std::int32_t script(const std::string& text) { return ktORBA_WriteScript(session, text.c_str(), &status); }
  std::int32_t stream(const std::string& name) {
    return ktORBA_ConfigureStreamingWaveform(session, name.c_str(), &status);
  }
  std::int32_t select(const char* name) { return ktORBA_SelectActiveScript(session, name, &status); }

  // The elaboration of a failed call, empty after a success.
  std::string failureOf(std::int32_t code) {
    EXPECT_EQ(code, status.code);
    status.code = 0;
    return code != 0 ? std::string(status.json) : "";
  }

  // Expects `part` in the elaboration; empty: success.
  void expectFailure(std::int32_t code, const std::string& part) {
    const std::string failure = failureOf(code);
    EXPECT_THAT(failure, HasSubstr(part));
    EXPECT_EQ(failure.empty(), part.empty());
  }

  SimulatedGenerator generator;
  std::uint32_t session = 0;
  Record status;
  std::vector<std::int16_t> samples = std::vector<std::int16_t>(3000);
};

TEST_F(HWControlTest, OtherBlocksAndVersionsAreRefused) {
  struct Case {
    std::uint16_t type, major, minor;
    std::uint64_t sampleWidth;
    std::int32_t code;
    const char* line;
  };
  for (const Case& c : {Case{102, 4, 3, 16, -1074101587, "208"}, Case{101, 4, 1, 16, -1074101621, "217"},
                        Case{101, 3, 9, 16, -1074101621, "217"}, Case{101, 5, 0, 16, -1074101622, "222"},
                        Case{101, 4, 3, 0x100, -1074097783, "261"}}) {
    ktSim_Traits traits = smallTraits();
    traits.reportedType = c.type;
    traits.versionMajor = c.major;
    traits.versionMinor = c.minor;
    SimulatedGenerator other(traits);
    other.overrideRegister(1, c.sampleWidth);
    EXPECT_EQ(other.open(session, 0, &status), c.code);
    EXPECT_EQ(failureOf(c.code), std::string(R"({"file":"includes\\ktorba\\commandControl\\CommandControl","line":)") +
                                     c.line + R"(,"component":"ktorbau"})");
  }
}

TEST_F(HWControlTest, UnworkableTraitsAreNamed) {
  struct Case {
    std::uint32_t registerNumber;
    std::uint64_t value;
    const char* message;
  };
  for (const Case& c : {Case{1, 7, "sampleWidthBits is 7; it must be at least 8"},
                        Case{2, 4, "memoryWordBits is 4; it must be at least 8"},
                        Case{2, 1024, "memoryWordBits is 1024; it must be at most 512"},
                        Case{27, 7, "downloadElementBits is 7; it must be at least 8"}}) {
    generator.overrideRegister(c.registerNumber, c.value);
    EXPECT_THAT(failureOf(open()), testing::AllOf(HasSubstr("::kErrorInternalSWError"), HasSubstr(c.message)));
    EXPECT_EQ(ktSim_RestoreRegister(generator.number, c.registerNumber), 0);
  }
}

// Generators that nothing rules out are opened; where the instructions have no room for theirs, the first script says
// so.
TEST_F(HWControlTest, UnusualTraitsAreTheGeneratorsOwn) {
  struct Case {
    std::vector<std::pair<std::uint32_t, std::uint64_t>> registers;
    const char* ofScript;    // part of the elaboration, empty for success
    const char* ofSettings;  // the same
  };
  for (const Case& c : {Case{{{1, 12}}, "", ""}, Case{{{2, 72}}, "", ""},
                        Case{{{0, 0}}, "its shortest fetch, 0 samples, and there wordCount 0 is below its limit 1", ""},
                        Case{{{2, 512}, {0, 10}},
                             "No script can be written for this generator: each begins and ends with a wait of its "
                             "shortest fetch, 10 samples, and there tailSkip 22 is above its limit 15",
                             ""},
                        Case{{{1, 64}, {2, 32}}, "samplesPerMemoryWord is 0", "samplesPerMemoryWord is 0"}}) {
    for (const auto& [number, value] : c.registers) generator.overrideRegister(number, value);
    ASSERT_EQ(failureOf(open()), "");
    EXPECT_EQ(failureOf(ktORBA_AllocateWaveform(session, "w", 40, &status)), "");
    expectFailure(ktORBA_WriteScript(session, "script s wait 16 end script", &status), c.ofScript);
    expectFailure(ktORBA_SetPrimingDepth(session, 0, &status), c.ofSettings);
    EXPECT_EQ(ktORBA_CloseOrbaSession(session, &status), 0);
    for (const auto& [number, value] : c.registers) EXPECT_EQ(ktSim_RestoreRegister(generator.number, number), 0);
  }
}

// Calls in order, each with a part of its elaboration, empty for success. The first rule broken is the one reported.
TEST_F(HWControlTest, Rules) {
  ASSERT_EQ(open(), 0);
  const std::uint32_t wide = 0;
  std::uint64_t space = 0;
  struct Case {
    std::function<std::int32_t()> call;
    const char* failure;
  };
  const Case cases[] = {
      {[&] { return ktORBA_StartGeneration(session, &status); }, "kErrorActiveSequenceNotSpecified"},
      {[&] { return allocate("", 0); }, "kErrorWaveformNameIsEmpty"},
      {[&] { return allocate("_x", 0); }, "kErrorLeadingUnderscoreInString"},
      {[&] { return allocate("w", 0); }, R"(kErrorNumSamplesInWaveformMustBeGreaterThanZero")"},
      {[&] { return allocate("w", 7); },
       R"(TypeWaveformLength","value":7,"value_type":"uint32_t"},{"type":"usage","usage":"kUsageTypeMinWave)"},
      {[&] { return allocate("w", 8); }, ""},
      {[&] { return allocate("W", 0); }, R"("usage":"kUsageTypeWaveformName","value":"W")"},
      {[&] { return allocate("x", 2041); },
       R"(kUsageTypeLargestAvailMemoryBlock","value":4080,"value_type":"uint32_t")"},
      {[&] { return allocate("x", 0x80000008); }, "kErrorTotalWaveformSizeExceedAllocatedSizeInFPGA"},
      {[&] { return allocate("x", 2037); }, ""},  // takes the last word of memory in part
      {[&] { return allocate("y", 8); }, R"(kUsageTypeLargestAvailMemoryBlock","value":0,)"},
      {[&] { return move(8, 0); }, ""},
      {[&] { return move(0u - 3, 1); }, ""},
      {[&] { return move(4, 1); }, R"("kUsageTypeAllocWaveformLength","value":8,"value_type":"uint32_t"},)"
                                   R"({"type":"usage","usage":"Write Position","value":"9","value_type":"int64_t")"},
      {[&] { return move(0u - 6, 1); }, R"("value":"-1","value_type":"int64_t")"},
      {[&] { return move(0x40000000, 0); }, R"("value":"-1073741824")"},  // a signed product of 32 bits
      {[&] { return move(0, 2); }, R"("usage":"kUsageTypeParameterName","value":"Write Position")"},
      {[&] { return write("w", 0); }, R"("kUsageTypeWaveformLength","value":0,"value_type":"uint32_t")"},
      {[&] { return write("w", 4); },
       R"("kUsageTypeAllocWaveformLength","value":8,"value_type":"uint32_t"},)"
       R"({"type":"usage","usage":"Write Position","value":"5","value_type":"uint64_t"},)"
       R"({"type":"usage","usage":"kUsageTypeNumSampsToWrite","value":"4","value_type":"uint64_t")"},
      {[&] { return write("w", 3, -1); }, ""},  // no limit of time
      {[&] { return write(nullptr, 3); }, R"("WriteWaveform":"Waveform name is NULL.")"},
      {[&] { return ktORBA_WriteWaveformI16(session, "w", nullptr, 8, 0, &status); }, "Waveform data is NULL."},
      {[&] { return ktORBA_WriteWaveformU32(session, "w", &wide, 1, 0, &status); }, "Requested sample size does not"},
      {[&] { return ktORBA_CheckStreamingWaveformSpace(session, &space, &status); },
       R"(kErrorSpecifiedWaveformNotFound")"},
      {[&] { return ktORBA_SetMemoryReadGrantTime(session, 3, &status); }, ""},
      {[&] { return ktORBA_SetMemoryWriteGrantTime(session, 1, &status); }, ""},
      {[&] { return stream("w"); }, R"("kUsageTypeWaveformLength","value":8,"value_type":"uint32_t"},)"
                                    R"({"type":"usage","usage":"kUsageTypeMinWaveformLength","value":9,)"},
      {[&] { return stream(std::string(511, 'x')); }, "ktorba_errors::kErrorSpecifiedWaveformNotFound"},
      {[&] { return stream(std::string(512, 'x')); }, R"("kUsageTypeMaxLength","value":"511","value_type":"uint64_t")"},
      {[&] { return stream("X"); }, ""},
      {[&] { return ktORBA_SetPrimingDepth(session, 2048, &status); }, ""},
      {[&] { return ktORBA_SetPrimingDepth(session, 2049, &status); },
       R"("usage":"kUsageTypeMaxValue","value":2048,"value_type":"uint32_t")"},
      {[&] { return script("script s generate w end script"); }, ""},
      {[&] { return ktORBA_ClearAllWaveforms(session, &status); }, ""},
      {[&] { return select("s"); }, R"(kErrorScriptNotInMem")"},
      {[&] { return allocate("all", 2048); }, ""},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE("call " + std::to_string(&c - cases));
    expectFailure(c.call(), c.failure);
  }
}

TEST_F(HWControlTest, FailedWriteGivesBackWhatItAllocated) {
  ASSERT_EQ(open(), 0);
  for (const char* function : {"ktIFW_Target_WriteArray", "KtFpgaDll_WriteFifoU8"}) {
    generator.failCall(function, -9);
    EXPECT_EQ(write("new", 2048), -9);
    status.code = 0;
    EXPECT_EQ(failureOf(allocate("New", 2048)), "");
    EXPECT_EQ(failureOf(ktORBA_ClearWaveform(session, "new", &status)), "");
  }
}

TEST_F(HWControlTest, SettingsThatTheHardwareRefusedAreForgotten) {
  ASSERT_EQ(open(), 0);
  generator.failCall("ktIFW_Target_WriteArray", -9);
  EXPECT_EQ(ktORBA_SetPrimingDepth(session, 40, nullptr), -9);
  EXPECT_EQ(ktORBA_SetMemoryReadGrantTime(session, 61, nullptr), 0);
  std::uint64_t primingWords = 0;
  EXPECT_EQ(ktSim_PeekRegister(generator.number, 12, &primingWords), 0);
  EXPECT_EQ(primingWords, 199u);
}

TEST_F(HWControlTest, ScriptsAreSentAgainAfterADownloadThatFailed) {
  ASSERT_EQ(open(), 0);
  EXPECT_EQ(write("w", 8), 0);
  EXPECT_EQ(failureOf(script("script a generate w end script script b generate w generate w end script")), "");
  generator.recordCalls();
  EXPECT_EQ(select("a"), 0);
  EXPECT_THAT(generator.takeCalls(), HasSubstr("write 10 <- 0, 11 <- 20, "));
  EXPECT_EQ(select("A"), 0);
  EXPECT_EQ(generator.takeCalls(), "");
  generator.failCall("ktIFW_Target_WriteArray", -9);
  EXPECT_EQ(select("b"), -9) << "nothing of it was sent";
  status.code = 0;
  generator.takeCalls();
  EXPECT_EQ(select("a"), 0);
  EXPECT_EQ(generator.takeCalls(), "");
  generator.failCall("ktIFW_Target_Read", -9);
  EXPECT_EQ(select("b"), -9) << "all of it was sent";
  status.code = 0;
  generator.takeCalls();
  EXPECT_EQ(select("a"), 0);
  EXPECT_THAT(generator.takeCalls(), HasSubstr("write 10 <- 0, 11 <- 20, "));

  std::string longScript = "script long ";
  for (int i = 0; i < 60; ++i) longScript += "generate w ";
  EXPECT_EQ(failureOf(script(longScript + "end script")), "") << "64 words with loop and ends";
  EXPECT_THAT(failureOf(script(longScript + "generate w end script")), HasSubstr("kErrorSequenceSizeTooLarge"));
}

}  // namespace
