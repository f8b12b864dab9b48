// What the exported functions cost above the platform calls that they make: those that access one register, a call
// that is refused, the look-up among many sessions, and opening a session on frameworks of many contexts. The platform
// libraries are doubles that return at once.
#include <benchmark/benchmark.h>

#include <cstdlib>
#include <memory>
#include <string>
#include <vector>

#include "benchmarks/HostOnDouble.h"

namespace {

std::uint64_t allocations = 0;

}  // namespace

// Counts what the process takes from the heap, operator new included, which comes here. The functions behind these
// names are the C library's own.
extern "C" {
void* __libc_malloc(std::size_t);
void* __libc_calloc(std::size_t, std::size_t);
void* __libc_realloc(void*, std::size_t);

void* malloc(std::size_t size) {
  ++allocations;
  return __libc_malloc(size);
}
void* calloc(std::size_t count, std::size_t size) {
  ++allocations;
  return __libc_calloc(count, size);
}
void* realloc(void* memory, std::size_t size) {
  ++allocations;
  return __libc_realloc(memory, size);
}
}

namespace {

using ktorba::Command;
using ktorba::Register;

constexpr char kWaveform[] = "streamed";

void apply(benchmark::State& state, const HostOnDouble& host) {
  require(state, ktORBA_SetPrimingDepth(host.session, 64, nullptr));
}

void makeReady(benchmark::State& state, const HostOnDouble& host) {
  require(state, ktORBA_AllocateWaveform(host.session, kWaveform, 4096, nullptr));
  require(state, ktORBA_WriteScript(host.session, "script s generate streamed end script", nullptr));
  require(state, ktORBA_SelectActiveScript(host.session, "s", nullptr));
}

void configureStreaming(benchmark::State& state, const HostOnDouble& host) {
  makeReady(state, host);
  require(state, ktORBA_ConfigureStreamingWaveform(host.session, kWaveform, nullptr));
}

std::int32_t checkStatus(std::uint32_t session) {
  std::uint8_t isDone = 0;
  return ktORBA_CheckGenerationStatus(session, &isDone, nullptr);
}

void checkStatusBare() {
  benchmark::DoNotOptimize(bare::readRegister(Register::kGenerationStatus));
  benchmark::DoNotOptimize(bare::readRegister(Register::kGenerationStatus));
}

std::int32_t checkSpace(std::uint32_t session) {
  std::uint64_t samples = 0;
  return ktORBA_CheckStreamingWaveformSpace(session, &samples, nullptr);
}

void checkSpaceBare() { benchmark::DoNotOptimize(bare::readRegister(Register::kStreamingFreeSpace)); }

std::int32_t start(std::uint32_t session) { return ktORBA_StartGeneration(session, nullptr); }
void startBare() { bare::writeCommand(Command::kInitiate); }

std::int32_t abort(std::uint32_t session) { return ktORBA_AbortGeneration(session, nullptr); }
void abortBare() { bare::writeCommand(Command::kAbort); }

void callOurs(benchmark::State& state, void (*prepare)(benchmark::State&, const HostOnDouble&),
              std::int32_t (*call)(std::uint32_t)) {
  const HostOnDouble host(state);
  prepare(state, host);
  require(state, call(host.session));
  const PlatformCallCounter counter(state);
  const std::uint64_t allocationsBefore = allocations;
  for (auto _ : state) benchmark::DoNotOptimize(call(host.session));
  state.counters["allocations"] = static_cast<double>(allocations - allocationsBefore);
}

void callBare(benchmark::State& state, void (*call)()) {
  const PlatformCallCounter counter(state);
  for (auto _ : state) call();
}

#define KTORBA_BENCHMARK_CALL(name, prepare, ours, bare)                 \
  BENCHMARK_CAPTURE(callOurs, name, prepare, ours)->Name(#name "/ours"); \
  BENCHMARK_CAPTURE(callBare, name, bare)->Name(#name "/bare");

KTORBA_BENCHMARK_CALL(check_status, apply, checkStatus, checkStatusBare)
KTORBA_BENCHMARK_CALL(check_space, configureStreaming, checkSpace, checkSpaceBare)
KTORBA_BENCHMARK_CALL(start, makeReady, start, startBare)
KTORBA_BENCHMARK_CALL(abort, apply, abort, abortBare)

void honourCallersError(benchmark::State& state) {
  tStatus status{-1, 0, nullptr, nullptr};
  for (auto _ : state) benchmark::DoNotOptimize(ktORBA_StartGeneration(1, &status));
}
BENCHMARK(honourCallersError)->Name("callers_error/ours");

void refuseUnknownHandle(benchmark::State& state) {
  for (auto _ : state) benchmark::DoNotOptimize(ktORBA_StartGeneration(0, nullptr));
}
BENCHMARK(refuseUnknownHandle)->Name("unknown_handle/ours");

// The handle of the last session is the last one that the look-up comes to.
void callLastOfSessions(benchmark::State& state) {
  std::vector<std::unique_ptr<HostOnDouble>> hosts;
  for (std::uint8_t i = 0; i < state.range(0); ++i) hosts.push_back(std::make_unique<HostOnDouble>(state, i));
  std::uint64_t size = 0;
  for (auto _ : state) {
    benchmark::DoNotOptimize(ktORBA_GetWaveformMemorySize(hosts.back()->session, &size, nullptr));
  }
}
BENCHMARK(callLastOfSessions)->Name("sessions/ours")->Arg(1)->Arg(16)->Arg(128);

// Closing is counted with opening.
void openSession(benchmark::State& state) {
  frameworkDouble().contexts = static_cast<std::uint32_t>(state.range(0));
  const PlatformCallCounter counter(state);
  for (auto _ : state) const HostOnDouble host(state);
}
BENCHMARK(openSession)->Name("open/ours")->RangeMultiplier(10)->Range(10, 10'000);

// The children of every context, their number asked for first.
void walkContexts(benchmark::State& state) {
  const auto contexts = static_cast<std::uint32_t>(state.range(0));
  frameworkDouble().contexts = contexts;
  const PlatformCallCounter counter(state);
  for (auto _ : state) {
    for (std::uint32_t context = 0; context < contexts; ++context) {
      tStatus status{};
      std::uint32_t count = 0;
      std::uint32_t children[10];
      ktIFW_Context_GetAllChildren(HostOnDouble::kSession, context, nullptr, 0, &count, &status);
      if (count > 0) ktIFW_Context_GetAllChildren(HostOnDouble::kSession, context, children, count, &count, &status);
    }
  }
}
BENCHMARK(walkContexts)->Name("open/bare")->RangeMultiplier(10)->Range(10, 10'000);

}  // namespace
