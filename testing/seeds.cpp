#include "testing/seeds.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <exception>
#include <string>

namespace {

std::uint64_t fromEnvironment(const char* name, std::uint64_t otherwise) {
  const char* const text = std::getenv(name);
  return text != nullptr ? std::strtoull(text, nullptr, 10) : otherwise;
}

}  // namespace

std::uint32_t pick(Random& random, std::uint32_t low, std::uint32_t high) {
  return std::uniform_int_distribution<std::uint32_t>(low, high)(random);
}

std::uint64_t firstSeed() { return fromEnvironment("KTORBA_SEED", 1); }

void forEachSeed(std::uint64_t count, const std::function<void(Random& random)>& test) {
  const std::uint64_t first = firstSeed();
  const std::uint64_t end = first + fromEnvironment("KTORBA_SEED_COUNT", count);
  for (std::uint64_t seed = first; seed < end && !testing::Test::HasFailure(); ++seed) {
    SCOPED_TRACE("KTORBA_SEED=" + std::to_string(seed));
    Random random(seed);
    try {
      test(random);
    } catch (const std::exception& failure) {
      ADD_FAILURE() << failure.what();
    }
  }
}
