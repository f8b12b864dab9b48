// Runs random operations on several sessions for as long as told, each compared with the model, and watches memory.
//
//   ktorba_soak [OPERATIONS]
//
// Its seed is KTORBA_SEED. Prints a line for each tenth. Ends with 1 where library and model differ, where memory grows
// from tenth to tenth, or where closing the sessions leaves memory behind.
#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <exception>
#include <memory>
#include <random>
#include <string>
#include <vector>

#include "platform/system/residentMemory.h"
#include "testing/ModelledSession.h"
#include "testing/heap.h"
#include "testing/seeds.h"

namespace {

constexpr int kTenths = 10;
constexpr int kSessions = 4;
// In a long run; a short one says little, and sanitizers hold on to much of what is freed.
constexpr std::int64_t kMostGrowthKiB = 1024;
constexpr std::int64_t kLongRun = 1'000'000;

using Sessions = std::vector<std::unique_ptr<soak::ModelledSession>>;

struct Usage {
  std::int64_t mostBlocks;
  std::int64_t residentKiB;
};

Usage operate(const Sessions& sessions, std::int64_t operations, const soak::Choose& choose) {
  std::int64_t mostBlocks = 0;
  for (std::int64_t i = 0; i < operations; ++i) {
    sessions[choose(kSessions)]->operate();
    mostBlocks = std::max(mostBlocks, heap::liveBlocks);
  }
  return {mostBlocks, platform::residentBytes() / 1024};
}

Sessions openSessions(const soak::Choose& choose) {
  Sessions sessions;
  for (int i = 0; i < kSessions; ++i) sessions.push_back(std::make_unique<soak::ModelledSession>(choose));
  return sessions;
}

bool isFlat(const Usage& first, const Usage& last, bool isLong) {
  return last.mostBlocks <= 2 * first.mostBlocks && (!isLong || last.residentKiB <= first.residentKiB + kMostGrowthKiB);
}

bool soakSessions(std::int64_t operations, const soak::Choose& choose) {
  operate(openSessions(choose), 1000, choose);  // what is made once and kept is made now
  std::vector<Usage> tenths;
  tenths.reserve(kTenths);
  const std::int64_t blocksBefore = heap::liveBlocks;
  {
    const Sessions sessions = openSessions(choose);
    std::printf("operations  blocks at most  resident KiB\n");
    for (int tenth = 1; tenth <= kTenths; ++tenth) {
      tenths.push_back(operate(sessions, operations / kTenths, choose));
      std::printf("%10lld %15lld %13lld\n", static_cast<long long>(operations / kTenths * tenth),
                  static_cast<long long>(tenths.back().mostBlocks), static_cast<long long>(tenths.back().residentKiB));
      std::fflush(stdout);
    }
  }
  const std::int64_t left = heap::liveBlocks - blocksBefore;
  std::printf("blocks left by %d sessions: %lld\n", kSessions, static_cast<long long>(left));
  return left == 0 && isFlat(tenths.front(), tenths.back(), operations >= kLongRun);
}

}  // namespace

int main(int argc, char** argv) {
  const std::int64_t operations = argc > 1 ? std::atoll(argv[1]) : 10'000'000;
  std::mt19937 random(static_cast<std::uint32_t>(firstSeed()));
  const auto choose = [&random](std::uint32_t count) { return static_cast<std::uint32_t>(random()) % count; };
  try {
    if (soakSessions(operations, choose)) return EXIT_SUCCESS;
  } catch (const std::exception& difference) {
    std::printf("%s\n", difference.what());
  }
  std::printf("KTORBA_SEED=%s\n", std::to_string(firstSeed()).c_str());
  return EXIT_FAILURE;
}
