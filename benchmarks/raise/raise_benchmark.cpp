// The cost of failing: raising and catching an error with three values against a bare throw and catch, at the same
// stack depth, of an exception that owns a buffer of the same size.
#include <benchmark/benchmark.h>

#include <cstdlib>
#include <exception>
#include <memory>

#include "kterr/Failure.h"

namespace {

constexpr int kStackDepth = 10;

[[noreturn]] void raiseFailure() {
  kterr::Failure(ktorba_errors::kErrorCannotWriteDataOutsideWaveformBoundaries)
      .at(R"(includes\ktorba\hwControl\HWControl)")
      .usage(kterr::kUsageTypeWaveformName, "burst_segment_07")
      .usage(kterr::kUsageTypeNumSampsToWrite, std::uint64_t{4096})
      .usage(kterr::kUsageTypeAllocWaveformLength, std::uint64_t{2048})
      .raise();
}

std::uint32_t elaborationCapacity() {
  try {
    raiseFailure();
  } catch (const kterr::Exception& exception) {
    return exception.status().capacity;
  }
}

struct Free {
  void operator()(void* memory) const { std::free(memory); }
};

class BareException : public std::exception {
 public:
  explicit BareException(std::size_t numBytes) : buffer_(std::malloc(numBytes)) {}
  BareException(const BareException& other) : std::exception(), buffer_(std::move(other.buffer_)) {}

 private:
  mutable std::unique_ptr<void, Free> buffer_;
};

[[noreturn]] void throwBare() {
  static const std::size_t kNumBytes = elaborationCapacity();
  BareException exception(kNumBytes);
  throw exception;
}

[[gnu::noinline]] void callAtDepth(int depth, void (*function)()) {
  if (depth == 0) {
    function();
  } else {
    callAtDepth(depth - 1, function);
  }
  benchmark::ClobberMemory();  // keeps the call from becoming a jump
}

void throwAndCatch(benchmark::State& state, void (*function)()) {
  for (auto _ : state) {
    try {
      callAtDepth(kStackDepth, function);
    } catch (const std::exception& exception) {
      benchmark::DoNotOptimize(exception.what());
    }
  }
}
BENCHMARK_CAPTURE(throwAndCatch, bare, throwBare)->Name("raise/bare");
BENCHMARK_CAPTURE(throwAndCatch, failure, raiseFailure)->Name("raise/ours");

}  // namespace
