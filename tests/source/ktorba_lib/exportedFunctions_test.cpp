// The exported functions over a session double. Linked twice: with elaborations going to nobody, as in libktorba, and
// to the caller, as in libktorba_elaborating.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <new>

#include "kterr/Failure.h"
#include "ktorba/ktorba.h"
#include "source/ktorba_lib/Frame.h"
#include "source/ktorba_lib/SessionDouble.h"
#include "source/ktorba_lib/SessionRegistry.h"

namespace {

using testing::HasSubstr;

constexpr std::int32_t kInvalidParameter = nKTAPALS100_tStatus_kInvalidParameter.code;
constexpr std::int32_t kSoftwareFault = nKTAPALS100_tStatus_kSoftwareFault.code;
constexpr std::int32_t kNotConvertible = ktorba_codes::kTextNotConvertible.code;
constexpr std::uint32_t kNoSuchHandle = 4'000'000'000;

CallLog* currentLog;

// What the host runtime was asked, "handle:mode", and what it answers.
std::string runtimeRequests;
std::int32_t runtimeAnswer = 1;
std::int32_t (*cleanUpProcedure)(std::uint32_t handle);

std::string request(std::uint32_t handle, int mode) {
  return std::to_string(handle) + ":" + std::to_string(mode) + " ";
}

}  // namespace

// The test program is the host process here, and exports what a host runtime does.
extern "C" __attribute__((visibility("default"))) std::int32_t PDRNRegisterCleanUpProc(
    std::int32_t (*procedure)(std::uint32_t handle), std::uint32_t handle, std::int32_t mode) {
  cleanUpProcedure = procedure;
  runtimeRequests += request(handle, mode);
  return runtimeAnswer;
}

ktorba_lib::SessionPtr ktorba_lib::openSession(const GeneratorAddress& g) {
  const int instance = g.instance;
  currentLog->add("open", g.fpgaSession, g.ifwTarget, g.ifwSession, g.parentContext, instance);
  return SessionPtr(new SessionDouble(std::to_string(g.fpgaSession) + ", " + std::to_string(instance), *currentLog));
}

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

using Call = std::int32_t (*)(std::uint32_t handle, tStatus* status);

struct Function {
  const char* name;
  Call call;
  const char* engineCalls;  // on a session whose settings are 1 2 3 4 stream
  friend void PrintTo(const Function& function, std::ostream* out) { *out << function.name; }
};

std::uint64_t wide;
std::uint8_t byte;
std::uint32_t opened;
const std::uint32_t kWords[2] = {};
const std::int16_t kShorts[2] = {};

#define KTORBA_CALL(...) [](std::uint32_t h, tStatus* s) { return (void)h, ktORBA_##__VA_ARGS__; }
#define KTORBA_ROW(engineCalls, ...) \
  { #__VA_ARGS__, KTORBA_CALL(__VA_ARGS__), engineCalls }

const Function kFunctions[] = {
    KTORBA_ROW("open 9 2 1 0 4", OpenOrbaSession(9, 2, 1, &kWords[1], 4, &opened, s)),
    KTORBA_ROW("", CloseOrbaSession(h, s)),
    KTORBA_ROW("memorySize", GetWaveformMemorySize(h, &wide, s)),
    KTORBA_ROW("allocate w\xC3\xB6 8", AllocateWaveform(h, "w\xC3\xB6", 8, s)),
    KTORBA_ROW("writeU32 w 2 -5", WriteWaveformU32(h, "w", kWords, 2, -5, s)),
    KTORBA_ROW("writeI16 w 2 5", WriteWaveformI16(h, "w", kShorts, 2, 5, s)),
    KTORBA_ROW("position w 255 16", SetWaveformNextWritePosition(h, "w", 16, 255, s)),
    KTORBA_ROW("clear w; streams w", ClearWaveform(h, "w", s)),
    KTORBA_ROW("clear stream; streams stream; apply 1 2 3 4 ", ClearWaveform(h, "stream", s)),
    KTORBA_ROW("clearAll; apply 1 2 3 4 ", ClearAllWaveforms(h, s)),
    KTORBA_ROW("script script x", WriteScript(h, "script x", s)),
    KTORBA_ROW("select 'x'; apply 1 2 3 77 stream", SelectActiveScript(h, "x", s)),
    KTORBA_ROW("select ''; apply 1 2 3 77 stream", SelectActiveScript(h, nullptr, s)),
    KTORBA_ROW("delete x", DeleteScript(h, "x", s)),
    KTORBA_ROW("start", StartGeneration(h, s)),
    KTORBA_ROW("abort", AbortGeneration(h, s)),
    KTORBA_ROW("check", CheckGenerationStatus(h, &byte, s)),
    KTORBA_ROW("reset; clearAll", Reset(h, s)),
    KTORBA_ROW("fifoDepth 7", SetDownloadFifoDepth(h, 7, s)),
    KTORBA_ROW("apply 7 2 3 4 stream", SetMemoryReadGrantTime(h, 7, s)),
    KTORBA_ROW("apply 1 7 3 4 stream", SetMemoryWriteGrantTime(h, 7, s)),
    KTORBA_ROW("apply 1 2 7 4 stream", SetPrimingDepth(h, 7, s)),
    KTORBA_ROW("chunkSize 7", SetWaveformWriteChunkSize(h, 7, s)),
    KTORBA_ROW("stream w", ConfigureStreamingWaveform(h, "w", s)),
    KTORBA_ROW("space", CheckStreamingWaveformSpace(h, &wide, s)),
};

class EachExportedFunction : public ExportedFunctions, public testing::WithParamInterface<Function> {};

TEST_P(EachExportedFunction, DoesItsWorkUnlessTheCallersRecordHoldsAnError) {
  char text[] = "{\"mine\":1}";
  for (const std::int32_t code : {-1074101603, 5}) {
    const tStatus before{code, sizeof text, kterr::defaultReallocJson, text};
    tStatus record = before;
    EXPECT_EQ(GetParam().call(handle, &record), std::min(code, 0));
    EXPECT_EQ(std::memcmp(&record, &before, sizeof record), 0);
    EXPECT_STREQ(text, "{\"mine\":1}");
    EXPECT_EQ(log.calls, code < 0 ? "" : GetParam().engineCalls);
    EXPECT_EQ(code < 0 ? runtimeRequests : "", "");
  }
  ktORBA_CloseOrbaSession(opened, nullptr);
}

TEST_P(EachExportedFunction, ReportsAnUnknownHandle) {
  if (GetParam().name[0] == 'O') return;  // Open is given none
  const bool closes = std::strncmp(GetParam().name, "Close", 5) == 0;
  expectFailure(GetParam().call(kNoSuchHandle, &status), kInvalidParameter,
                std::string(closes ? "\"ktORBA_CloseOrbaSession\"" : "\"ktorba_lib::getSessionPtr\"") +
                    ":\"Invalid orba session handle\"}");
  EXPECT_EQ(log.calls, "");
}

TEST_P(EachExportedFunction, TurnsWhatIsThrownIntoACode) {
  if (GetParam().engineCalls[0] == '\0') return;
  log.onCall = [] { kterr::Failure(ktmxl::kErrorScriptNotInMem).at("here", 12).message("key", "why").raise(); };
  expectFailure(GetParam().call(handle, &status), ktmxl::kErrorScriptNotInMem.code, R"("ktorbau","key":"why"})");
  log.onCall = [] { throw std::bad_alloc(); };
  expectFailure(GetParam().call(handle, &status), kSoftwareFault, "{}");
}

INSTANTIATE_TEST_SUITE_P(All, EachExportedFunction, testing::ValuesIn(kFunctions));

TEST_F(ExportedFunctions, ReportNullPointersBeforeTheHandleIsLookedAt) {
  const struct {
    const char* function;
    const char* message;
    Call call;
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
  EXPECT_EQ(log.calls, "");
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
  EXPECT_EQ(log.calls, "");
  const std::string huge(100'000'000, 'n');
  EXPECT_EQ(ktORBA_AllocateWaveform(handle, huge.c_str(), 1, nullptr), 0);
  EXPECT_EQ(log.calls, "allocate 100000000 bytes 1");
}

TEST_F(ExportedFunctions, OpenOneSessionPerGenerator) {
  std::uint32_t second = 0;
  const std::uint32_t context = 6;
  expectFailure(
      ktORBA_OpenOrbaSession(3, 1, 1, &context, 0, &second, &status), kInvalidParameter,
      "\"ktORBA_OpenOrbaSession\":\"Session already open to this Waveform Generation instance, on this device.\"");
  EXPECT_EQ(log.calls, "open 3 1 1 6 0");
  EXPECT_EQ(log.sessionsAlive, 1);
  EXPECT_EQ(second, 0u);
  log.onCall = [] { kterr::Failure(ktorba_codes::kFlaggedFpgaSession).at("here").raise(); };
  EXPECT_EQ(ktORBA_OpenOrbaSession(8, 0, 0, nullptr, 0, &second, nullptr), -1);
  EXPECT_EQ(second, 0u);
  EXPECT_EQ(runtimeRequests, "");
  log.onCall = [] {};
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
  EXPECT_EQ(runtimeRequests,
            request(second, 2) + request(second, 0) + request(second, 0) + request(third, 2) + request(third, 0));
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
