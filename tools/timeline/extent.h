// Numbers of samples that may leave 64 bits: sums and products stop at kBeyond, which stands for all that is greater.
// Pure functions; any thread may call.
#pragma once

#include <cstdint>

namespace tools {

inline constexpr std::uint64_t kBeyond = UINT64_MAX;

constexpr std::uint64_t extentSum(std::uint64_t a, std::uint64_t b) { return a > kBeyond - b ? kBeyond : a + b; }

constexpr std::uint64_t extentProduct(std::uint64_t a, std::uint64_t b) {
  return b != 0 && a > kBeyond / b ? kBeyond : a * b;
}

}  // namespace tools
