// The exported functions over a session double. Linked twice: with elaborations going to nobody, as in libktorba, and
// to the caller, as in libktorba_elaborating.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstring>
#include <new>

#include "kterr/Failure.h"
#include "ktorba/ktorba.h"
#include "source/ktorba_lib/Frame.h"
#include "source/ktorba_lib/SessionDouble.h"
#include "source/ktorba_lib/SessionRegistry.h"

namespace {

using testing::ElementsAreArray;
using testing::HasSubstr;
using testing::IsEmpty;

constexpr std::int32_t kInvalidParameter = nKTAPALS100_tStatus_kInvalidParameter.code;
constexpr std::int32_t kSoftwareFault = nKTAPALS100_tStatus_kSoftwareFault.code;
constexpr std::int32_t kNotConvertible = ktorba_codes::kTextNotConvertible.code;
constexpr std::uint32_t kNoSuchHandle = 4'000'000'000;

CallLog* currentLog;
std::function<void()> whileBuilding = [] {};

// What the host runtime was asked, "handle:mode", and what it answers.
std::vector<std::string> runtimeRequests;
std::int32_t runtimeAnswer = 1;
std::int32_t (*cleanUpProcedure)(std::uint32_t handle);

}  // namespace

// The test program is the host process here, and exports what a host runtime does.
extern "C" __attribute__((visibility("default"))) std::int32_t PDRNRegisterCleanUpProc(
    std::int32_t (*procedure)(std::uint32_t handle), std::uint32_t handle, std::int32_t mode) {
  cleanUpProcedure = procedure;
  runtimeRequests.push_back(std::to_string(handle) + ":" + std::to_string(mode));
  return runtimeAnswer;
}

namespace ktorba_lib {

SessionPtr openSession(const GeneratorAddress& g) {
  whileBuilding();
  currentLog->calls.push_back("open " + std::to_string(g.fpgaSession) + " " + std::to_string(g.ifwTarget) + " " +
                              std::to_string(g.ifwSession) + " " + std::to_string(g.parentContext) + " " +
                              std::to_string(g.instance));
  return SessionPtr(new SessionDouble(std::to_string(g.fpgaSession) + ", " + std::to_string(g.instance), *currentLog));
}

}  // namespace ktorba_lib

namespace {

bool elaborates() {
  tStatus record = kterr::makeStatus();
  return ktorba_lib::elaborationTarget(&record) == &record;
}

class ExportedFunctions : public testing::Test {
 protected:
  ExportedFunctions() {
    currentLog = &log;
    EXPECT_EQ(ktORBA_OpenOrbaSession(3, 0, 0, nullptr, 0, &handle, nullptr), 0);
    log.calls.clear();
    runtimeRequests.clear();
  }
  ~ExportedFunctions() override {
    log.onCall = [] {};
    whileBuilding = [] {};
    runtimeAnswer = 1;
    ktORBA_CloseOrbaSession(handle, nullptr);
    EXPECT_EQ(log.sessionsAlive, 0);
    kterr::freeJson(status);
  }

  // Expects `result` to be `code`, told in the caller's record as the linked variant does.
  void expectFailure(std::int32_t result, std::int32_t code, const std::string& text) {
    EXPECT_EQ(result, code);
    EXPECT_EQ(status.code, elaborates() ? code : 0);
    EXPECT_THAT(status.json != nullptr ? status.json : "none", HasSubstr(elaborates() ? text : "none"));
    status.code = 0;
  }

  CallLog log;
  std::uint32_t handle = 0;
  tStatus status = kterr::makeStatus();
};

struct Function {
  const char* name;
  std::function<std::int32_t(std::uint32_t handle, tStatus* status)> call;
  std::vector<std::string> engineCalls;  // on a session whose settings are 1 2 3 4 'stream'
};

std::uint64_t wide;
std::uint8_t byte;
std::uint32_t opened;
const std::uint32_t kWords[2] = {};
const std::int16_t kShorts[2] = {};

#define KTORBA_CALL(...) [](std::uint32_t h, tStatus* s) { return (void)h, ktORBA_##__VA_ARGS__; }

const Function kFunctions[] = {
    {"Open", KTORBA_CALL(OpenOrbaSession(9, 2, 1, &kWords[1], 4, &opened, s)), {"open 9 2 1 0 4"}},
    {"GetWaveformMemorySize", KTORBA_CALL(GetWaveformMemorySize(h, &wide, s)), {"getWaveformMemorySize"}},
    {"AllocateWaveform", KTORBA_CALL(AllocateWaveform(h, "w\xC3\xB6", 8, s)), {"allocateWaveform w\xC3\xB6 8"}},
    {"WriteWaveformU32", KTORBA_CALL(WriteWaveformU32(h, "w", kWords, 2, -5, s)), {"writeU32 w 2 -5"}},
    {"WriteWaveformI16", KTORBA_CALL(WriteWaveformI16(h, "w", kShorts, 2, 5, s)), {"writeI16 w 2 5"}},
    {"SetWaveformNextWritePosition",
     KTORBA_CALL(SetWaveformNextWritePosition(h, "w", 16, 255, s)),
     {"setWaveformNextWritePosition w 255 16"}},
    {"ClearWaveform", KTORBA_CALL(ClearWaveform(h, "w", s)), {"clearWaveform w", "isStreamingWaveform w"}},
    {"ClearStreamingWaveform",
     KTORBA_CALL(ClearWaveform(h, "stream", s)),
     {"clearWaveform stream", "isStreamingWaveform stream", "applySettings 1 2 3 4 ''"}},
    {"ClearAllWaveforms", KTORBA_CALL(ClearAllWaveforms(h, s)), {"clearAllWaveforms", "applySettings 1 2 3 4 ''"}},
    {"WriteScript", KTORBA_CALL(WriteScript(h, "script x", s)), {"writeScript script x"}},
    {"SelectActiveScript",
     KTORBA_CALL(SelectActiveScript(h, "x", s)),
     {"selectActiveScript 'x'", "applySettings 1 2 3 77 'stream'"}},
    {"SelectNoScript",
     KTORBA_CALL(SelectActiveScript(h, nullptr, s)),
     {"selectActiveScript ''", "applySettings 1 2 3 77 'stream'"}},
    {"DeleteScript", KTORBA_CALL(DeleteScript(h, "x", s)), {"deleteScript x"}},
    {"StartGeneration", KTORBA_CALL(StartGeneration(h, s)), {"startGeneration"}},
    {"AbortGeneration", KTORBA_CALL(AbortGeneration(h, s)), {"abortGeneration"}},
    {"CheckGenerationStatus", KTORBA_CALL(CheckGenerationStatus(h, &byte, s)), {"checkGenerationStatus"}},
    {"Reset", KTORBA_CALL(Reset(h, s)), {"resetGeneration", "clearAllWaveforms"}},
    {"SetDownloadFifoDepth", KTORBA_CALL(SetDownloadFifoDepth(h, 7, s)), {"setDownloadFifoDepth 7"}},
    {"SetMemoryReadGrantTime", KTORBA_CALL(SetMemoryReadGrantTime(h, 7, s)), {"applySettings 7 2 3 4 'stream'"}},
    {"SetMemoryWriteGrantTime", KTORBA_CALL(SetMemoryWriteGrantTime(h, 7, s)), {"applySettings 1 7 3 4 'stream'"}},
    {"SetPrimingDepth", KTORBA_CALL(SetPrimingDepth(h, 7, s)), {"applySettings 1 2 7 4 'stream'"}},
    {"SetWaveformWriteChunkSize", KTORBA_CALL(SetWaveformWriteChunkSize(h, 7, s)), {"setWaveformWriteChunkSize 7"}},
    {"ConfigureStreamingWaveform",
     KTORBA_CALL(ConfigureStreamingWaveform(h, "w", s)),
     {"configureStreamingWaveform w"}},
    {"CheckStreamingWaveformSpace",
     KTORBA_CALL(CheckStreamingWaveformSpace(h, &wide, s)),
     {"checkStreamingWaveformSpace"}},
    {"Close", KTORBA_CALL(CloseOrbaSession(h, s)), {}},
};

class EachExportedFunction : public ExportedFunctions, public testing::WithParamInterface<Function> {};

TEST_P(EachExportedFunction, DoesItsWorkUnlessTheCallersRecordHoldsAnError) {
  char text[] = "{\"mine\":1}";
  const tStatus failed{-1074101603, sizeof text, kterr::defaultReallocJson, text};
  tStatus record = failed;
  EXPECT_EQ(GetParam().call(handle, &record), -1074101603);
  EXPECT_EQ(std::memcmp(&record, &failed, sizeof record), 0);
  EXPECT_STREQ(text, "{\"mine\":1}");
  EXPECT_THAT(log.calls, IsEmpty());
  EXPECT_THAT(runtimeRequests, IsEmpty());

  const tStatus warned{5, sizeof text, kterr::defaultReallocJson, text};
  record = warned;
  EXPECT_EQ(GetParam().call(handle, &record), 0);
  EXPECT_EQ(std::memcmp(&record, &warned, sizeof record), 0);
  EXPECT_THAT(log.calls, ElementsAreArray(GetParam().engineCalls));
  ktORBA_CloseOrbaSession(opened, nullptr);
}

TEST_P(EachExportedFunction, ReportsAnUnknownHandle) {
  if (GetParam().name == std::string("Open")) return;
  const std::string function =
      GetParam().name == std::string("Close") ? "ktORBA_CloseOrbaSession" : "ktorba_lib::getSessionPtr";
  expectFailure(GetParam().call(kNoSuchHandle, &status), kInvalidParameter,
                "\"" + function + "\":\"Invalid orba session handle\"}");
  EXPECT_THAT(log.calls, IsEmpty());
}

TEST_P(EachExportedFunction, TurnsWhatIsThrownIntoACode) {
  const auto fail = [this](std::function<void()> thrower) { log.onCall = whileBuilding = std::move(thrower); };
  if (GetParam().engineCalls.empty()) return;
  fail([] { kterr::Failure(ktmxl::kErrorScriptNotInMem).at("here", 12).message("key", "why").raise(); });
  expectFailure(GetParam().call(handle, &status), ktmxl::kErrorScriptNotInMem.code,
                R"("component":"ktorbau","key":"why"})");
  fail([] { throw std::bad_alloc(); });
  expectFailure(GetParam().call(handle, &status), kSoftwareFault, "{}");
}

INSTANTIATE_TEST_SUITE_P(All, EachExportedFunction, testing::ValuesIn(kFunctions),
                         [](const auto& row) { return row.param.name; });

TEST_F(ExportedFunctions, ReportNullPointersBeforeTheHandleIsLookedAt) {
  const struct {
    const char* function;
    const char* message;
    std::function<std::int32_t(std::uint32_t handle, tStatus* status)> call;
  } rows[] = {
      {"OpenOrbaSession", "orbaSessionHandle", KTORBA_CALL(OpenOrbaSession(3, 0, 0, nullptr, 0, nullptr, s))},
      {"GetWaveformMemorySize", "memorySize", KTORBA_CALL(GetWaveformMemorySize(h, nullptr, s))},
      {"AllocateWaveform", "waveformName", KTORBA_CALL(AllocateWaveform(h, nullptr, 1, s))},
      {"SetWaveformNextWritePosition", "waveformName", KTORBA_CALL(SetWaveformNextWritePosition(h, nullptr, 0, 0, s))},
      {"ClearWaveform", "waveformName", KTORBA_CALL(ClearWaveform(h, nullptr, s))},
      {"WriteScript", "script", KTORBA_CALL(WriteScript(h, nullptr, s))},
      {"DeleteScript", "scriptName", KTORBA_CALL(DeleteScript(h, nullptr, s))},
      {"CheckGenerationStatus", "isDone", KTORBA_CALL(CheckGenerationStatus(h, nullptr, s))},
      {"ConfigureStreamingWaveform", "streamingWaveformName", KTORBA_CALL(ConfigureStreamingWaveform(h, nullptr, s))},
      {"CheckStreamingWaveformSpace", "waveFormSpaceInSamples",
       KTORBA_CALL(CheckStreamingWaveformSpace(h, nullptr, s))},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.function);
    expectFailure(
        row.call(kNoSuchHandle, &status), kInvalidParameter,
        R"("component":"ktorbau","ktORBA_)" + std::string(row.function) + "\":\"" + row.message + "is NULL!\"}");
  }
  EXPECT_THAT(log.calls, IsEmpty());
}

TEST_F(ExportedFunctions, WriteResultsOfTheirOwnWidth) {
  struct {
    std::uint8_t before = 0xAA, value = 0xAA, after = 0xAA;
  } done;
  EXPECT_EQ(ktORBA_CheckGenerationStatus(handle, &done.value, nullptr), 0);
  EXPECT_EQ(done.before + done.value + done.after, 0xAA + 1 + 0xAA);
  std::uint64_t size = ~std::uint64_t{0};
  EXPECT_EQ(ktORBA_GetWaveformMemorySize(handle, &size, nullptr), 0);
  EXPECT_EQ(size, 0xFEDCBA98u);
  EXPECT_EQ(ktORBA_CheckStreamingWaveformSpace(handle, &size, nullptr), 0);
  EXPECT_EQ(size, 0x123456789ABCDEF0u);
}

TEST_F(ExportedFunctions, ConvertTextsAfterTheLookUpSaveOne) {
  const char* const bad = "\xC0\xAF";
  EXPECT_EQ(ktORBA_AllocateWaveform(kNoSuchHandle, bad, 1, nullptr), kInvalidParameter);
  EXPECT_EQ(ktORBA_SelectActiveScript(kNoSuchHandle, bad, nullptr), kInvalidParameter);
  EXPECT_EQ(ktORBA_ConfigureStreamingWaveform(kNoSuchHandle, bad, nullptr), kNotConvertible);
  expectFailure(ktORBA_WriteScript(handle, bad, &status), kNotConvertible,
                R"({"error_constant":"err","file":"ktsstutf8/mbsToUtf8","line":77,"component":"ktorbau"})");
  EXPECT_THAT(log.calls, IsEmpty());
  const std::string huge(100'000'000, 'n');
  EXPECT_EQ(ktORBA_AllocateWaveform(handle, huge.c_str(), 1, nullptr), 0);
  EXPECT_THAT(log.calls, ElementsAreArray({"allocateWaveform 100000000 bytes 1"}));
}

TEST_F(ExportedFunctions, OpenOneSessionPerGenerator) {
  std::uint32_t second = 0;
  const std::uint32_t context = 6;
  expectFailure(
      ktORBA_OpenOrbaSession(3, 1, 1, &context, 0, &second, &status), kInvalidParameter,
      "\"ktORBA_OpenOrbaSession\":\"Session already open to this Waveform Generation instance, on this device.\"");
  EXPECT_THAT(log.calls, ElementsAreArray({"open 3 1 1 6 0"}));
  EXPECT_EQ(log.sessionsAlive, 1);
  EXPECT_EQ(second, 0u);
  whileBuilding = [] { kterr::Failure(ktorba_codes::kFlaggedFpgaSession).at("here").raise(); };
  EXPECT_EQ(ktORBA_OpenOrbaSession(8, 0, 0, nullptr, 0, &second, nullptr), -1);
  EXPECT_EQ(second, 0u);
  EXPECT_THAT(runtimeRequests, IsEmpty());
  EXPECT_EQ(ktORBA_StartGeneration(handle, nullptr), 0);
}

TEST_F(ExportedFunctions, RegisterHandlesWithTheHostRuntime) {
  std::uint32_t second = 0;
  EXPECT_EQ(ktORBA_OpenOrbaSession(3, 0, 0, nullptr, 1, &second, nullptr), 0);
  EXPECT_EQ(second, handle + 1);
  EXPECT_EQ(cleanUpProcedure(second), 0);
  EXPECT_EQ(log.sessionsAlive, 1);
  EXPECT_EQ(cleanUpProcedure(second), 0);  // closed already

  runtimeAnswer = 0;
  std::uint32_t third = 0;
  expectFailure(ktORBA_OpenOrbaSession(3, 0, 0, nullptr, 2, &third, &status), kSoftwareFault,
                "\"ktORBA_OpenOrbaSession\":\"callback registration failed\"");
  EXPECT_EQ(ktORBA_StartGeneration(third, nullptr), 0);
  EXPECT_EQ(ktORBA_CloseOrbaSession(third, nullptr), 0);
  const std::string two = std::to_string(second), three = std::to_string(third);
  EXPECT_THAT(runtimeRequests, ElementsAreArray({two + ":2", two + ":0", two + ":0", three + ":2", three + ":0"}));
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
    EXPECT_EQ(record.code, elaborates() ? kInvalidParameter : before);
    EXPECT_STREQ(buffer, "{}");  // too small for the text
  }
}

}  // namespace
