// What an exported call costs before the engine is reached: a caller's error honoured, the look-up of a handle that is
// unknown (which raises and catches an error), and the look-up of the last of several sessions.
#include <benchmark/benchmark.h>

#include "ktorba/ktorba.h"
#include "source/ktorba_lib/SessionDouble.h"
#include "source/ktorba_lib/SessionRegistry.h"

namespace {
CallLog callLog;
}

namespace ktorba_lib {

SessionPtr openSession(const GeneratorAddress& generator) {
  return SessionPtr(new SessionDouble(std::to_string(generator.instance), callLog));
}

}  // namespace ktorba_lib

namespace {

void honourCallersError(benchmark::State& state) {
  tStatus status{-1, 0, nullptr, nullptr};
  for (auto _ : state) benchmark::DoNotOptimize(ktORBA_StartGeneration(1, &status));
}
BENCHMARK(honourCallersError);

void refuseUnknownHandle(benchmark::State& state) {
  for (auto _ : state) benchmark::DoNotOptimize(ktORBA_StartGeneration(0, nullptr));
}
BENCHMARK(refuseUnknownHandle);

void lookUpLastOfSessions(benchmark::State& state) {
  const auto count = static_cast<std::uint8_t>(state.range(0));
  std::uint32_t handle = 0;
  for (std::uint8_t i = 0; i < count; ++i) ktORBA_OpenOrbaSession(0, 0, 0, nullptr, i, &handle, nullptr);
  for (auto _ : state) benchmark::DoNotOptimize(ktorba_lib::getSessionPtr(handle));
  for (std::uint8_t i = 0; i < count; ++i) ktORBA_CloseOrbaSession(handle - i, nullptr);
}
BENCHMARK(lookUpLastOfSessions)->Arg(1)->Arg(16)->Arg(128);

}  // namespace
