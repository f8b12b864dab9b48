// A typical session from open to close. Its calls of the two platform libraries stand, operation by operation, in the
// golden file platformCalls.txt.
//
// And the same with one thing going wrong: for every k, the k-th call of a platform function, and the k-th allocation
// of memory. The operation that it happens in reports it, the next try succeeds, and what is played in the end is
// right to the bit.
#include <gtest/gtest.h>

#include <functional>
#include <sstream>
#include <string_view>
#include <utility>
#include <vector>

#include "ktorba/error_codes.h"
#include "testing/SimulatedGenerator.h"
#include "testing/golden.h"
#include "testing/heap.h"

namespace {

// The library's requests count; the test's own succeed.
class Uncounted {
 public:
  Uncounted() { heap::isCounting = false; }
  ~Uncounted() { heap::isCounting = true; }
};

constexpr std::int32_t kTimeoutMs = 10000;
constexpr std::int32_t kInjectedCode = -4711;

// The record with register look-ups in front of the transfer that they are for: "[17] read 17".
std::string foldLookUps(const std::string& record) {
  constexpr std::string_view kLookUp = "ktIFW_Context_Contextualize context=2 offset=";
  std::istringstream lines(record);
  std::string folded, offsets;
  for (std::string line; std::getline(lines, line);) {
    if (line.starts_with(kLookUp)) {
      offsets += (offsets.empty() ? "" : " ") + line.substr(kLookUp.size());
    } else {
      folded += (offsets.empty() ? "" : "[" + offsets + "] ") + line + "\n";
      offsets.clear();
    }
  }
  return folded;
}

struct Step {
  const char* name;
  std::function<std::int32_t()> run;
  std::int32_t halfDoneCode;  // what a second try may report where the first one did its part before it failed
};

// The typical session, step by step, with every operation of the library in it. Samples count up from the waveform's
// first value, so that every sample tells where it belongs.
class TypicalSession {
 public:
  TypicalSession() {
    add("open", [this] { return generator.open(session_); });
    add("set the write grant time to its default", call(ktORBA_SetMemoryWriteGrantTime, std::uint16_t{30}));
    addRefused("start without a script", ktorba_errors_kErrorActiveSequenceNotSpecified, call(ktORBA_StartGeneration));
    firstWaveform_ = steps_.size();
    for (const auto& [name, length] : {std::pair{"a", 40u}, {"b", 33u}, {"c", 64u}, {"d", 51u}}) {
      add("allocate", call(ktORBA_AllocateWaveform, name, length));
      add("write 7 samples", [=, this] { return write(name, 0, 7); });
      add("write 14 behind them", [=, this] { return write(name, 7, 14); });
      add("write the rest", [=, this] { return write(name, 21, length - 21); });
    }
    addRefused("write past the end", ktorba_errors_kErrorCannotWriteDataOutsideWaveformBoundaries,
               [this] { return write("a", 40, 1); });
    add("set chunks of 64 bytes", call(ktORBA_SetWaveformWriteChunkSize, 64));
    add("write an unknown waveform, which ends inside a memory word", [this] { return write("loop", 0, kLoopLength); });
    add("write scripts", call(ktORBA_WriteScript, kScripts));
    add("select one", call(ktORBA_SelectActiveScript, "t"));
    add("select another", call(ktORBA_SelectActiveScript, "s"));
    add("select it again", call(ktORBA_SelectActiveScript, "S"));
    add("start", call(ktORBA_StartGeneration));
    add("play", [this] { return playToTheEnd(); });
    add("abort", call(ktORBA_AbortGeneration));
    add("set the read grant time", call(ktORBA_SetMemoryReadGrantTime, std::uint16_t{61}));
    add("set it to the same", call(ktORBA_SetMemoryReadGrantTime, std::uint16_t{61}));
    addRefused("set a priming depth above the limit", ktorba_errors_kErrorPrimingDepthTooLarge,
               call(ktORBA_SetPrimingDepth, 2049));
    add("set a priming depth of 37 samples", call(ktORBA_SetPrimingDepth, 37));
    add("set the FIFO depth", call(ktORBA_SetDownloadFifoDepth, 8192));
    add("stream", call(ktORBA_ConfigureStreamingWaveform, "loop"));
    add("select the endless script", call(ktORBA_SelectActiveScript, "t"));
    add("start", call(ktORBA_StartGeneration));
    add("play", [this] { return advance(100 + kMinFetch, streamed_); });
    add("space", [this] { return checkSpace(); });
    add("write while streaming", [this] { return write("loop", kLoopLength, 80); });
    add("play on", [this] { return advance(kLoopLength - 20, streamed_); });
    add("write around the end", [this] { return write("loop", 0, 150); });
    add("abort", call(ktORBA_AbortGeneration));
    add("write 3 samples, from the start again", [this] { return write("loop", 0, 3); });
    add("clear another waveform", call(ktORBA_ClearWaveform, "a"));
    // The waveform is gone before the settings without streaming are applied.
    add("clear the streaming waveform", call(ktORBA_ClearWaveform, "loop"),
        ktorba_errors_kErrorSpecifiedWaveformNotFound);
    add("delete a script", call(ktORBA_DeleteScript, "t"));
    add("write another waveform", [this] { return write("next", 0, 200); });
    add("stream it", call(ktORBA_ConfigureStreamingWaveform, "next"));
    add("clear all waveforms", call(ktORBA_ClearAllWaveforms));
    add("set chunks of 4096 bytes", call(ktORBA_SetWaveformWriteChunkSize, 4096));
    add("write the whole memory", [this] { return write("x", 0, 2048); });
    add("reset", call(ktORBA_Reset));
    add("memory size", call(ktORBA_GetWaveformMemorySize, &bytes_));
    add("close", call(ktORBA_CloseOrbaSession));
  }

  // Runs every step; one that fails is reported to `onFailure` and tried again, or, where its transfer has been cut
  // short, the session is reset and played from its waveforms on. Returns how many steps failed.
  int run(const std::function<void(const char* step, std::int32_t code)>& onFailure) {
    int failures = 0;
    for (std::size_t i = 0; i < steps_.size(); ++i) {
      heap::isCounting = true;
      const std::int32_t code = steps_[i].run();
      heap::isCounting = false;
      if (code == 0) continue;
      ++failures;
      onFailure(steps_[i].name, code);
      if (transferWasCutShort()) {
        EXPECT_EQ(ktORBA_Reset(session_, nullptr), 0);
        EXPECT_EQ(ktORBA_ConfigureStreamingWaveform(session_, "", nullptr), 0);
        played_.clear();
        streamed_.clear();
        i = firstWaveform_ - 1;
      } else if (const std::int32_t again = steps_[i].run(); again != 0 && again != steps_[i].halfDoneCode) {
        ADD_FAILURE() << steps_[i].name << " failed with " << code << " and again with " << again;
        return failures;
      }
    }
    return failures;
  }

  // Runs every step, and tells what each calls of the platform.
  std::string transcribe() {
    std::string text;
    for (const Step& step : steps_) {
      EXPECT_EQ(step.run(), 0) << step.name;
      text += std::string("==== ") + step.name + "\n" + foldLookUps(generator.takeCalls());
    }
    return text;
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

  SimulatedGenerator generator;

 private:
  static constexpr std::uint32_t kMinFetch = 8;
  static constexpr std::uint32_t kLoopLength = 198;
  static constexpr char kScripts[] =
      "script s generate a marker0(9) generate b subset(4,20) repeat 2 generate c end repeat generate d end script "
      "script t repeat forever generate loop end repeat end script";

  void add(const char* name, std::function<std::int32_t()> run, std::int32_t halfDoneCode = 0) {
    steps_.push_back({name, std::move(run), halfDoneCode});
  }

  // A step that is done when it is refused with `expected`.
  void addRefused(const char* name, std::int32_t expected, const std::function<std::int32_t()>& run) {
    add(name, [=] {
      const std::int32_t code = run();
      EXPECT_NE(code, 0) << name;
      return code == expected ? 0 : code;
    });
  }

  template <typename Function, typename... Arguments>
  std::function<std::int32_t()> call(Function function, Arguments... arguments) {
    return [=, this] { return function(session_, arguments..., nullptr); };
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

  std::int32_t advance(std::uint64_t count, std::vector<std::int16_t>& output) {
    const Uncounted pause;
    const std::vector<std::int16_t> samples = generator.play(count);
    output.insert(output.end(), samples.begin(), samples.end());
    return 0;
  }

  std::int32_t checkSpace() {
    std::uint64_t space = 0;
    const std::int32_t code = ktORBA_CheckStreamingWaveformSpace(session_, &space, nullptr);
    EXPECT_TRUE(code != 0 || space == 96) << space << " samples";
    return code;
  }

  std::int32_t playToTheEnd() {
    advance(1000, played_);
    std::uint8_t isDone = 0;
    const std::int32_t code = ktORBA_CheckGenerationStatus(session_, &isDone, nullptr);
    EXPECT_EQ(isDone, code == 0);
    return code;
  }

  // Whether the generator still waits for bytes of a memory write that will never come.
  bool transferWasCutShort() const { return !generator.state().writeReady; }

  std::uint32_t session_ = 0;
  std::uint64_t bytes_ = 0;
  std::vector<Step> steps_;
  std::size_t firstWaveform_ = 0;  // the step that allocates it
  std::vector<std::int16_t> played_, streamed_;
};

// Calls `work` from a destructor that an exception runs: of a host's own, which is none of the library's affair.
void callWhileUnwinding(const std::function<void()>& work) {
  struct Host {
    ~Host() { work(); }
    const std::function<void()>& work;
  };
  try {
    const Host host{work};
    throw 1;
  } catch (int) {
  }
}

// Plays one session per k until nothing fails any more. `arm` sets the fault of a session up, `enter` calls the
// library.
template <typename Arm, typename Check, typename Enter>
void sweep(Arm&& arm, Check&& isExpected, Enter&& enter) {
  std::int64_t k = 0;
  int failures = 0;
  do {
    SCOPED_TRACE("fault " + std::to_string(++k));
    TypicalSession session;
    arm(session, k);
    enter([&] {
      failures = session.run(
          [&](const char* step, std::int32_t code) { EXPECT_TRUE(isExpected(code)) << step << " reported " << code; });
    });
    heap::refusedRequest = 0;
    EXPECT_LE(failures, 1);
    session.expectPlayedRight();
  } while (failures > 0 && !testing::Test::HasFailure());
  testing::Test::RecordProperty("faults", std::to_string(k - 1));
  EXPECT_TRUE(k > 100 || testing::Test::HasFailure()) << "the sweep ended early";
}

TEST(PlatformCalls, OfEveryOperation) {
  TypicalSession session;
  session.generator.recordCalls();
  expectGolden(KTORBA_GOLDEN_FILE, session.transcribe());
}

void callPlainly(const std::function<void()>& work) { work(); }

TEST(FaultSweep, EveryPlatformCall) {
  const auto arm = [](TypicalSession& session, std::int64_t k) {
    session.generator.failCall(nullptr, kInjectedCode, static_cast<std::uint64_t>(k));
  };
  const auto isInjected = [](std::int32_t code) { return code == kInjectedCode; };
  sweep(arm, isInjected, callPlainly);
  sweep(arm, isInjected, callWhileUnwinding);
}

TEST(FaultSweep, EveryAllocation) {
  sweep([](TypicalSession&, std::int64_t k) { heap::refusedRequest = k; },
        [](std::int32_t code) {
          return code == ktorba_nKTAPALS100_tStatus_kSoftwareFault || code == ktorba_codes_kNoMemory ||
                 code == KTSIM_E_MEMORY;
        },
        callPlainly);
}

}  // namespace
