// The typical session of platformCalls.txt, and the same with one thing going wrong: for every k, the k-th call of a
// platform function, and the k-th allocation of memory. The operation that it happens in reports it, the next try
// succeeds, and everything comes out as in the session without a fault, every sample played included.
#include <gtest/gtest.h>

#include <fstream>

#include "ktorba/error_codes.h"
#include "testing/TextSession.h"
#include "testing/heap.h"

namespace {

constexpr std::int32_t kInjectedCode = -4711;

struct Step {
  std::string call;
  std::string outcome;
};

const std::vector<Step>& typicalSession() {
  static const std::vector<Step> steps = [] {
    std::vector<Step> all;
    TextSession session;
    std::ifstream file(KTORBA_GOLDEN_FILE);
    for (std::string line; std::getline(file, line);) {
      if (isCall(line) && !line.starts_with("RecordCalls")) all.push_back({line, session.perform(line)});
    }
    return all;
  }();
  return steps;
}

// The waveform is gone before the settings without streaming are applied.
bool isHalfDone(const Step& step, std::int32_t code) {
  return step.call == "ClearWaveform loop" && code == ktorba_errors_kErrorSpecifiedWaveformNotFound;
}

// Whether the generator still waits for bytes of a memory write that will never come.
bool waitsForBytes(const TextSession& session) { return !session.device->state().writeReady; }

// Plays the session. A step that fails is tried again; where its transfer has been cut short, the session is reset and
// played from its waveforms on. Returns how many steps failed.
int playThrough(TextSession& session, const std::function<bool(std::int32_t code)>& isExpected) {
  const std::vector<Step>& steps = typicalSession();
  int failures = 0;
  for (std::size_t i = 0; i < steps.size() && failures <= 1; ++i) {
    if (session.perform(steps[i].call) == steps[i].outcome) continue;
    ++failures;
    EXPECT_TRUE(isExpected(session.code)) << steps[i].call << " reported " << session.code;
    if (waitsForBytes(session)) {
      EXPECT_EQ(session.perform("Reset") + session.perform("ConfigureStreamingWaveform \"\""), "");
      i = 2;  // AllocateWaveform is next
    } else if (const std::string again = session.perform(steps[i].call); !isHalfDone(steps[i], session.code)) {
      EXPECT_EQ(again, steps[i].outcome) << steps[i].call << ", tried again";
    }
  }
  return failures;
}

// Plays one session per k until nothing fails any more. `arm` sets the fault of a session up.
template <typename Arm, typename Check>
void sweep(Arm&& arm, Check&& isExpected) {
  std::int64_t k = 0;
  int failures = 0;
  do {
    SCOPED_TRACE("fault " + std::to_string(++k));
    TextSession session;
    arm(session, k);
    failures = playThrough(session, isExpected);
    heap::refusedRequest = 0;
    EXPECT_LE(failures, 1);
  } while (failures > 0 && !testing::Test::HasFailure());
  testing::Test::RecordProperty("faults", std::to_string(k - 1));
  EXPECT_TRUE(k > 100 || testing::Test::HasFailure()) << "the sweep ended early";
}

// Calls from a destructor that an exception runs: of a host's own, which is none of the library's affair.
void callWhileUnwinding(const std::function<void()>& call) {
  struct Host {
    ~Host() { call(); }
    const std::function<void()>& call;
  };
  try {
    const Host host{call};
    throw 1;
  } catch (int) {
  }
}

// The library's requests count; the test's own succeed.
void callCounting(const std::function<void()>& call) {
  heap::isCounting = true;
  call();
  heap::isCounting = false;
}

TEST(PlatformCalls, OfEveryOperation) { expectSessions(KTORBA_GOLDEN_FILE); }

TEST(FaultSweep, EveryPlatformCall) {
  const auto arm = [](TextSession& session, std::int64_t k) {
    session.device->failCall(nullptr, kInjectedCode, static_cast<std::uint64_t>(k));
  };
  const auto isInjected = [](std::int32_t code) { return code == kInjectedCode; };
  sweep(arm, isInjected);
  sweep([&](TextSession& session, std::int64_t k) { arm(session, k), session.caller = callWhileUnwinding; },
        isInjected);
}

TEST(FaultSweep, EveryAllocation) {
  sweep([](TextSession& session, std::int64_t k) { heap::refusedRequest = k, session.caller = callCounting; },
        [](std::int32_t code) {
          return code == ktorba_nKTAPALS100_tStatus_kSoftwareFault || code == ktorba_codes_kNoMemory ||
                 code == KTSIM_E_MEMORY;
        });
}

}  // namespace
