// Where randomness in tests comes from. Seeds count up from KTORBA_SEED in the environment, 1 when it is not there; a
// test that fails tells the seed that it failed with.
#pragma once

#include <cstdint>
#include <functional>
#include <random>

using Random = std::mt19937_64;

// Uniform over low to high, both included.
std::uint32_t pick(Random& random, std::uint32_t low, std::uint32_t high);

// KTORBA_SEED, or 1.
std::uint64_t firstSeed();

// Runs the test with one seed after the other until one fails: with `count` of them, or KTORBA_SEED_COUNT.
void forEachSeed(std::uint64_t count, const std::function<void(Random& random)>& test);
