// A typical session from open to close, with one thing going wrong: for every k, the k-th call of a platform function,
// and the k-th allocation of memory. The operation that it happens in reports it, the next try succeeds, and what is
// played in the end is right to the bit.
#include <gtest/gtest.h>

#include <cstdlib>
#include <functional>
#include <new>
#include <numeric>
#include <utility>
#include <vector>

#include "ktorba/error_codes.h"
#include "source/ktorba_lib/SimulatedGenerator.h"

namespace {

std::int64_t allocationsUntilFailure = 0;  // 0: none fails
bool isCounting = false;                   // while the library runs; the test's own allocations succeed

class Uncounted {
 public:
  Uncounted() { isCounting = false; }
  ~Uncounted() { isCounting = true; }
};

}  // namespace

[[gnu::noinline]] void* operator new(std::size_t size) {
  if (isCounting && allocationsUntilFailure > 0 && --allocationsUntilFailure == 0) throw std::bad_alloc();
  if (void* const memory = std::malloc(size > 0 ? size : 1)) return memory;
  throw std::bad_alloc();
}
// Not inlined, or the compiler takes the free() for a mismatch with new.
[[gnu::noinline]] void operator delete(void* memory) noexcept { std::free(memory); }
[[gnu::noinline]] void operator delete(void* memory, std::size_t) noexcept { std::free(memory); }

namespace {

constexpr std::int32_t kTimeoutMs = 10000;
constexpr std::int32_t kInjectedCode = -4711;

struct Step {
  const char* name;
  std::function<std::int32_t()> run;
  std::int32_t halfDoneCode;  // what a second try may report where the first one did its part before it failed
};

// The typical session, step by step. Samples count up from the waveform's first value, so that every sample tells
// where it belongs.
class TypicalSession {
 public:
  TypicalSession() {
    add("open", [this] { return generator.open(session_); });
    for (const auto& [name, length] : {std::pair{"a", 40u}, {"b", 33u}, {"c", 64u}, {"d", 51u}}) {
      add("allocate", [=, this] { return ktORBA_AllocateWaveform(session_, name, length, nullptr); });
      add("write", [=, this] { return write(name, 0, 7); });
      add("write on", [=, this] { return write(name, 7, 13); });
      add("write the rest", [=, this] { return write(name, 20, length - 20); });
    }
    add("write unallocated", [this] { return write("loop", 0, kLoopLength); });
    add("scripts", [this] { return ktORBA_WriteScript(session_, kScripts, nullptr); });
    add("select other", [this] { return ktORBA_SelectActiveScript(session_, "t", nullptr); });
    add("select", [this] { return ktORBA_SelectActiveScript(session_, "s", nullptr); });
    add("start", [this] { return ktORBA_StartGeneration(session_, nullptr); });
    add("play", [this] { return playToTheEnd(); });
    add("abort", [this] { return ktORBA_AbortGeneration(session_, nullptr); });
    add("grant", [this] { return ktORBA_SetMemoryReadGrantTime(session_, 40, nullptr); });
    add("depth", [this] { return ktORBA_SetDownloadFifoDepth(session_, 8192, nullptr); });
    add("stream", [this] { return ktORBA_ConfigureStreamingWaveform(session_, "loop", nullptr); });
    add("select stream", [this] { return ktORBA_SelectActiveScript(session_, "t", nullptr); });
    add("start stream", [this] { return ktORBA_StartGeneration(session_, nullptr); });
    add("play stream", [this] { return advance(100 + kMinFetch, streamed_); });
    add("space", [this] { return ktORBA_CheckStreamingWaveformSpace(session_, &space_, nullptr); });
    add("write stream", [this] { return write("loop", kLoopLength, 80); });
    add("play on", [this] { return advance(kLoopLength - 20, streamed_); });
    add("abort stream", [this] { return ktORBA_AbortGeneration(session_, nullptr); });
    // The waveform is gone before the settings without streaming are applied.
    add(
        "clear one", [this] { return ktORBA_ClearWaveform(session_, "loop", nullptr); },
        ktorba_errors_kErrorSpecifiedWaveformNotFound);
    add("clear", [this] { return ktORBA_ClearAllWaveforms(session_, nullptr); });
    add("whole memory", [this] { return write("x", 0, 2048); });
    add("reset", [this] { return ktORBA_Reset(session_, nullptr); });
    add("close", [this] { return ktORBA_CloseOrbaSession(session_, nullptr); });
  }

  // Runs every step; one that fails is reported to `onFailure` and tried again, or, where its transfer has been cut
  // short, the session is reset and played from its waveforms on. Returns how many steps failed.
  int run(const std::function<void(const char* step, std::int32_t code)>& onFailure) {
    int failures = 0;
    for (std::size_t i = 0; i < steps_.size(); ++i) {
      isCounting = true;
      const std::int32_t code = steps_[i].run();
      isCounting = false;
      if (code == 0) continue;
      ++failures;
      onFailure(steps_[i].name, code);
      if (transferWasCutShort()) {
        EXPECT_EQ(ktORBA_Reset(session_, nullptr), 0);
        EXPECT_EQ(ktORBA_ConfigureStreamingWaveform(session_, "", nullptr), 0);
        played_.clear();
        streamed_.clear();
        i = 0;  // open; the waveforms come next
      } else if (const std::int32_t again = steps_[i].run(); again != 0 && again != steps_[i].halfDoneCode) {
        ADD_FAILURE() << steps_[i].name << " failed with " << code << " and again with " << again;
        return failures;
      }
    }
    return failures;
  }

  void expectPlayedRight() {
    std::vector<std::int16_t> expected(kMinFetch, 0);
    const auto add = [&](const char* name, std::uint32_t first, std::uint32_t count) {
      for (std::uint32_t i = 0; i < count; ++i) expected.push_back(sampleOf(name, first + i));
    };
    add("a", 0, 40);
    add("b", 4, 20);
    add("c", 0, 64);
    add("c", 0, 64);
    add("d", 0, 51);
    expected.resize(expected.size() + kMinFetch, expected.back());
    EXPECT_EQ(played_, expected);
    std::vector<std::int16_t> stream(kMinFetch, 0);
    for (std::uint32_t i = 0; i < kLoopLength + 80; ++i) stream.push_back(sampleOf("loop", i));
    EXPECT_EQ(streamed_, stream);
  }

  SimulatedGenerator generator{SimulatedGenerator::smallTraits()};

 private:
  static constexpr std::uint32_t kMinFetch = 8;
  static constexpr std::uint32_t kLoopLength = 200;
  static constexpr char kScripts[] =
      "script s generate a marker0(9) generate b subset(4,20) repeat 2 generate c end repeat generate d end script "
      "script t repeat forever generate loop end repeat end script";

  void add(const char* name, std::function<std::int32_t()> run, std::int32_t halfDoneCode = 0) {
    steps_.push_back({name, std::move(run), halfDoneCode});
  }

  static std::int16_t sampleOf(const char* name, std::uint32_t index) {
    return static_cast<std::int16_t>(name[0] * 256 + static_cast<std::int32_t>(index));
  }

  std::int32_t write(const char* name, std::uint32_t first, std::uint32_t count) const {
    const std::vector<std::int16_t> samples = samplesOf(name, first, count);
    return ktORBA_WriteWaveformI16(session_, name, samples.data(), count, kTimeoutMs, nullptr);
  }

  static std::vector<std::int16_t> samplesOf(const char* name, std::uint32_t first, std::uint32_t count) {
    const Uncounted pause;
    std::vector<std::int16_t> samples(count);
    for (std::uint32_t i = 0; i < count; ++i) samples[i] = sampleOf(name, first + i);
    return samples;
  }

  std::int32_t advance(std::uint64_t count, std::vector<std::int16_t>& output) const {
    const Uncounted pause;
    std::vector<std::int16_t> samples(count);
    std::uint64_t played = 0;
    const std::int32_t code = ktSim_AdvanceInto(generator.number, count, samples.data(), nullptr, &played);
    output.insert(output.end(), samples.begin(), samples.begin() + static_cast<std::ptrdiff_t>(played));
    return code;
  }

  std::int32_t playToTheEnd() {
    if (const std::int32_t code = advance(1000, played_)) return code;
    std::uint8_t isDone = 0;
    const std::int32_t code = ktORBA_CheckGenerationStatus(session_, &isDone, nullptr);
    EXPECT_EQ(isDone, code == 0);
    return code;
  }

  // Whether the generator still waits for bytes of a memory write that will never come.
  bool transferWasCutShort() const {
    ktSim_State state;
    EXPECT_EQ(ktSim_GetState(generator.number, &state), 0);
    return !state.writeReady;
  }

  std::uint32_t session_ = 0;
  std::uint64_t space_ = 0;
  std::vector<Step> steps_;
  std::vector<std::int16_t> played_, streamed_;
};

// Plays one session per k until nothing fails any more. `arm` sets the fault of a session up.
template <typename Arm, typename Check>
void sweep(Arm&& arm, Check&& isExpected) {
  std::int64_t k = 0;
  int failures = 0;
  do {
    SCOPED_TRACE("fault " + std::to_string(++k));
    TypicalSession session;
    arm(session, k);
    failures = session.run(
        [&](const char* step, std::int32_t code) { EXPECT_TRUE(isExpected(code)) << step << " reported " << code; });
    allocationsUntilFailure = 0;
    EXPECT_LE(failures, 1);
    session.expectPlayedRight();
  } while (failures > 0 && !testing::Test::HasFailure());
  testing::Test::RecordProperty("faults", std::to_string(k - 1));
  EXPECT_TRUE(k > 100 || testing::Test::HasFailure()) << "the sweep ended early";
}

TEST(FaultSweep, EveryPlatformCall) {
  sweep(
      [](TypicalSession& session, std::int64_t k) {
        const auto call = static_cast<std::uint64_t>(k);
        ASSERT_EQ(ktSim_FailCall(session.generator.fpga.fpgaSession, nullptr, call, kInjectedCode, nullptr), 0);
      },
      [](std::int32_t code) { return code == kInjectedCode; });
}

TEST(FaultSweep, EveryAllocation) {
  sweep([](TypicalSession&, std::int64_t k) { allocationsUntilFailure = k; },
        [](std::int32_t code) {
          return code == ktorba_nKTAPALS100_tStatus_kSoftwareFault || code == ktorba_codes_kNoMemory ||
                 code == KTSIM_E_MEMORY;
        });
}

}  // namespace
