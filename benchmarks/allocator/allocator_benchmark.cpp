// The allocator of sample memory beside its model, which walks over all free blocks. One operation is one release and
// one allocation in a memory of `live` blocks, about half as many free blocks between them.
#include <benchmark/benchmark.h>

#include <memory>
#include <numeric>
#include <random>
#include <utility>
#include <vector>

#include "ktorba/waveform/MemoryBlockManager.h"
#include "testing/WalkingMemoryBlockManager.h"

namespace {

constexpr std::uint32_t kGranularity = 8;

std::uint32_t randomSize(std::mt19937& random) { return kGranularity * static_cast<std::uint32_t>(1 + random() % 64); }

template <typename Manager>
class Fragmented {
 public:
  explicit Fragmented(std::size_t live) : manager_(0xFFFFFFF8, kGranularity) {
    for (std::size_t i = 0; i < live * 3 / 2; ++i) starts_.push_back(manager_.allocateBlock(randomSize(random_)));
    while (starts_.size() > live) release();
  }

  void releaseAndAllocate() {
    release();
    starts_.push_back(manager_.allocateBlock(randomSize(random_)));
  }

 private:
  void release() {
    std::uint32_t& start = starts_[random_() % starts_.size()];
    manager_.freeBlock(start);
    start = starts_.back();
    starts_.pop_back();
  }

  Manager manager_;
  std::mt19937 random_{1};
  std::vector<std::uint32_t> starts_;
};

template <typename Manager>
void releaseAndAllocate(benchmark::State& state) {
  Fragmented<Manager> memory(static_cast<std::size_t>(state.range(0)));
  for (auto _ : state) memory.releaseAndAllocate();
  state.SetItemsProcessed(state.iterations());
}

// What a memory as large as the allocator's tables for so many blocks takes to answer: reads at random places, each
// known only when the one before has come.
void readAtRandom(benchmark::State& state) {
  constexpr std::size_t kBytesPerBlock = 16;  // two keys for every free block, one for every live one
  std::vector<std::uint32_t> next(static_cast<std::size_t>(state.range(0)) * kBytesPerBlock / sizeof(std::uint32_t));
  std::iota(next.begin(), next.end(), 0u);
  std::mt19937 random{1};
  for (std::size_t i = next.size() - 1; i > 0; --i) std::swap(next[i], next[random() % i]);  // a single cycle
  std::uint32_t place = 0;
  for (auto _ : state) benchmark::DoNotOptimize(place = next[place]);
}

// Setting up takes longer than measuring: numbers of iterations are fixed, so that it is done once.
void sizes(benchmark::internal::Benchmark* benchmark) { benchmark->RangeMultiplier(10)->Range(1'000, 1'000'000); }

BENCHMARK(releaseAndAllocate<ktorba::MemoryBlockManager>)->Name("allocator/ours")->Apply(sizes)->Iterations(50'000);
BENCHMARK(readAtRandom)->Name("allocator/read")->Apply(sizes)->Iterations(5'000'000);
BENCHMARK(releaseAndAllocate<ktorba::WalkingMemoryBlockManager>)
    ->Name("allocator/walk")
    ->RangeMultiplier(10)
    ->Range(1'000, 100'000)
    ->Iterations(200);

}  // namespace
