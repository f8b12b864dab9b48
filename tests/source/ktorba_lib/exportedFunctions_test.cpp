// The exported functions of one of the two libraries: of libktorba, which elaborates to nobody, or of
// libktorba_elaborating, which elaborates to the caller.
#include <gmock/gmock.h>

#include <cstring>

#include "kterr/ErrorConstant.h"
#include "platform/system/DynamicLibrary.h"
#include "testing/DeviceUnderTest.h"
#include "testing/Record.h"

namespace {

using testing::HasSubstr;

constexpr std::int32_t kInvalidParameter = nKTAPALS100_tStatus_kInvalidParameter.code;
constexpr std::int32_t kSoftwareFault = nKTAPALS100_tStatus_kSoftwareFault.code;
constexpr std::int32_t kNotConvertible = ktorba_codes::kTextNotConvertible.code;
constexpr std::uint32_t kNoSuchHandle = 4'000'000'000;

// What the host runtime was asked, "handle:mode", and what it answers.
std::string runtimeRequests;
std::int32_t runtimeAnswer = 1;
bool runtimeThrows = false;
std::int32_t (*cleanUpProcedure)(std::uint32_t handle);

std::string request(std::uint32_t handle, int mode) {
  return std::to_string(handle) + ":" + std::to_string(mode) + " ";
}

}  // namespace

// The test program is the host process here, and exports what a host runtime does.
extern "C" KTORBA_EXPORTED std::int32_t PDRNRegisterCleanUpProc(std::int32_t (*procedure)(std::uint32_t handle),
                                                                std::uint32_t handle, std::int32_t mode) {
  cleanUpProcedure = procedure;
  runtimeRequests += request(handle, mode);
  if (runtimeThrows) throw 1;
  return runtimeAnswer;
}

namespace {

class ExportedFunctions : public testing::Test {
 protected:
  ExportedFunctions() {
    EXPECT_EQ(device.open(handle), 0);
    EXPECT_EQ(ktORBA_AllocateWaveform(handle, "w", 1000, nullptr), 0);
    runtimeRequests.clear();
  }
  ~ExportedFunctions() override {
    runtimeAnswer = 1;
    runtimeThrows = false;
    EXPECT_EQ(ktORBA_CloseOrbaSession(handle, nullptr), 0);
  }

  // Expects `result` to be `code`, told in the caller's record as the linked library does.
  void expectFailure(std::int32_t result, std::int32_t code, const std::string& text) {
    EXPECT_EQ(result, code);
    EXPECT_EQ(status.code, KTORBA_ELABORATES ? code : 0);
    EXPECT_THAT(status.json != nullptr ? status.json : "none", HasSubstr(KTORBA_ELABORATES ? text : "none"));
    status.code = 0;
  }

  DeviceUnderTest device;
  std::uint32_t handle = 0;
  Record status;
};

// That every function does both, the soak sees.
TEST_F(ExportedFunctions, HonourAnErrorOnEntryAndRefuseUnknownHandles) {
  const std::pair<decltype(&ktORBA_Reset), std::string> rows[] = {
      {ktORBA_CloseOrbaSession, "ktORBA_CloseOrbaSession"}, {ktORBA_StartGeneration, "ktorba_lib::getSessionPtr"}};
  char text[] = "{\"mine\":1}";
  const tStatus before{-1074101603, sizeof text, kterr::defaultReallocJson, text};
  for (const auto& [call, raisedIn] : rows) {
    tStatus record = before;
    EXPECT_EQ(call(handle, &record), before.code);
    EXPECT_EQ(std::memcmp(&record, &before, sizeof record), 0);
    EXPECT_STREQ(text, "{\"mine\":1}");
    EXPECT_EQ(runtimeRequests, "");
    expectFailure(call(kNoSuchHandle, &status), kInvalidParameter,
                  "\"" + raisedIn + "\":\"Invalid orba session handle\"}");
    runtimeRequests.clear();
  }
}

TEST_F(ExportedFunctions, TellWhatWasRaised) {
  if (otherDevice()) GTEST_SKIP() << "calls fail on demand on the simulated generator alone";
  const std::uint32_t fpga = device.simulated().fpga.fpgaSession;
  ASSERT_EQ(ktSim_FailCall(fpga, nullptr, 1, -9, R"({"component":"xy","file":"f"})"), 0);
  expectFailure(ktORBA_Reset(handle, &status), -9, R"({"file":"f","line":0,"component":"xy"})");
  tStatus warning{5, 0, nullptr, nullptr};
  EXPECT_EQ(ktORBA_Reset(handle, &warning), 0);
  EXPECT_EQ(warning.code, 5);
}

TEST_F(ExportedFunctions, WriteOneByteOfStatus) {
  struct {
    std::uint8_t before = 0xAA, value = 0xAA, after = 0xAA;
  } done;
  EXPECT_EQ(ktORBA_CheckGenerationStatus(handle, &done.value, nullptr), 0);
  EXPECT_EQ(done.before + done.value + done.after, 0xAA + 0xAA);
}

TEST_F(ExportedFunctions, ConvertTextsAfterTheLookUpSaveOne) {
  const char* const bad = "\xC0\xAF";
  EXPECT_EQ(ktORBA_AllocateWaveform(kNoSuchHandle, bad, 1, nullptr), kInvalidParameter);
  EXPECT_EQ(ktORBA_SelectActiveScript(kNoSuchHandle, bad, nullptr), kInvalidParameter);
  EXPECT_EQ(ktORBA_ConfigureStreamingWaveform(kNoSuchHandle, bad, nullptr), kNotConvertible);
  expectFailure(ktORBA_WriteScript(handle, bad, &status), kNotConvertible,
                R"({"error_constant":"err","file":"ktsstutf8/mbsToUtf8","line":77,"component":"ktorbau"})");
  EXPECT_EQ(ktORBA_SelectActiveScript(handle, nullptr, nullptr), 0);
  const std::string huge(10'000'000, 'n');
  EXPECT_EQ(ktORBA_AllocateWaveform(handle, huge.c_str(), 1, nullptr), ktmxl::kErrorNameTooLong.code);
}

TEST_F(ExportedFunctions, OpenOneSessionPerGenerator) {
  std::uint32_t second = 0;
  expectFailure(
      device.open(second, &status), kInvalidParameter,
      "\"ktORBA_OpenOrbaSession\":\"Session already open to this Waveform Generation instance, on this device.\"");
  expectFailure(ktORBA_OpenOrbaSession(3, 0, 0, nullptr, 0, nullptr, &status), kInvalidParameter,
                "\"ktORBA_OpenOrbaSession\":\"orbaSessionHandleis NULL!\"}");
  EXPECT_EQ(second, 0u);
  EXPECT_EQ(runtimeRequests, "");
  if (otherDevice()) GTEST_SKIP() << "further on the codes are those of the simulated generator";
  const ktSim_Fpga& fpga = device.simulated().fpga;
  EXPECT_EQ(ktORBA_OpenOrbaSession(0x2000, 0, fpga.ifwSession, nullptr, 0, &second, nullptr), -1);
  EXPECT_EQ(ktORBA_OpenOrbaSession(fpga.fpgaSession, 0, fpga.ifwSession, nullptr, 0, &second, nullptr), KTSIM_E_CHILD)
      << "without a parent it is the root";
}

TEST_F(ExportedFunctions, RegisterHandlesWithTheHostRuntime) {
  if (otherDevice()) GTEST_SKIP() << "it takes three generators on one FPGA";
  SimulatedGenerator& generator = device.simulated();
  generator.add();
  generator.add();
  std::uint32_t second = 0;
  EXPECT_EQ(generator.open(second, 1), 0);
  EXPECT_EQ(second, handle + 1);
  EXPECT_EQ(cleanUpProcedure(second), 0);
  EXPECT_EQ(ktORBA_AbortGeneration(second, nullptr), kInvalidParameter) << "closed";
  EXPECT_EQ(cleanUpProcedure(second), 0);

  runtimeAnswer = 0;
  std::uint32_t third = 0;
  expectFailure(generator.open(third, 2, &status), kSoftwareFault,
                "\"ktORBA_OpenOrbaSession\":\"callback registration failed\"");
  EXPECT_EQ(ktORBA_AbortGeneration(third, nullptr), 0);
  EXPECT_EQ(ktORBA_CloseOrbaSession(third, nullptr), 0);
  EXPECT_EQ(runtimeRequests,
            request(second, 2) + request(second, 0) + request(second, 0) + request(third, 2) + request(third, 0));
}

TEST_F(ExportedFunctions, SurviveCallbacksThatThrow) {
  if (otherDevice()) GTEST_SKIP() << "it takes two generators on one FPGA";
  SimulatedGenerator& generator = device.simulated();
  std::uint32_t other = kNoSuchHandle;
  generator.add();
  runtimeThrows = true;
  EXPECT_EQ(generator.open(other, 1, &status), kSoftwareFault) << "a refusal";
  status.code = 0;
  EXPECT_EQ(ktORBA_Reset(other, nullptr), 0);
  EXPECT_EQ(ktORBA_CloseOrbaSession(other, nullptr), 0) << "closes all the same";
  EXPECT_EQ(ktORBA_Reset(other, nullptr), kInvalidParameter);
  tStatus record{0, 0, [](tStatus*, std::uint32_t) -> bool { throw 1; }, nullptr};
  EXPECT_EQ(ktORBA_Reset(kNoSuchHandle, &record), kInvalidParameter);
  EXPECT_EQ(record.json, nullptr);
}

// A program may link one library while a plug-in of it loads the other one.
TEST_F(ExportedFunctions, ReachTheirOwnLibrary) {
  if (otherDevice()) GTEST_SKIP() << "it takes two FPGAs";
  std::string error;
  const platform::DynamicLibrary library(KTORBA_OTHER_LIBRARY);
  const auto openThere =
      reinterpret_cast<decltype(&ktORBA_OpenOrbaSession)>(library.find("ktORBA_OpenOrbaSession", error));
  const auto resetThere = reinterpret_cast<decltype(&ktORBA_Reset)>(library.find("ktORBA_Reset", error));
  ASSERT_NE(resetThere, nullptr) << error;
  EXPECT_EQ(library.find("SetPDRNModuleHook", error), library.find("SetPDRNTLSIndexHook", error)) << "one entry";
  const SimulatedGenerator another;
  const ktSim_Fpga& fpga = another.fpga;
  std::uint32_t there = 0;
  // Handles count up in each library, so that sooner or later one of theirs is ours, too.
  while (there < handle) {
    EXPECT_TRUE(there == 0 || cleanUpProcedure(there) == 0);
    ASSERT_EQ(openThere(fpga.fpgaSession, fpga.ifwTarget, fpga.ifwSession, &fpga.parentContext, 0, &there, nullptr), 0);
  }
  ASSERT_EQ(there, handle);
  EXPECT_EQ(cleanUpProcedure(there), 0);
  EXPECT_EQ(resetThere(there, nullptr), kInvalidParameter);
  EXPECT_EQ(ktORBA_Reset(handle, nullptr), 0);
}

TEST_F(ExportedFunctions, SurviveRecordsThatLie) {
  const auto refuse = [](tStatus*, std::uint32_t) { return false; };
  const auto lie = [](tStatus*, std::uint32_t) { return true; };
  char buffer[64] = "{}";
  const tStatus records[] = {
      {0, 0, nullptr, nullptr}, {0, 0, refuse, nullptr},
      {0, 0, lie, nullptr},     {0, 4096, nullptr, nullptr},
      {0, 4096, lie, nullptr},  {0, 0, nullptr, buffer},
      {0, 0, lie, buffer},      {0, 3, refuse, buffer},
      {7, 64, nullptr, buffer}, {0, 4096, kterr::defaultReallocJson, nullptr},
  };
  for (tStatus record : records) {
    const std::int32_t before = record.code;
    EXPECT_EQ(ktORBA_StartGeneration(kNoSuchHandle, &record), kInvalidParameter);
    EXPECT_EQ(record.code, KTORBA_ELABORATES ? kInvalidParameter : before);
    EXPECT_STREQ(buffer, "{}");  // too small for the text
  }
}

}  // namespace
