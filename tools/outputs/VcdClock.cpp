#include "tools/outputs/VcdClock.h"

#include <boost/multiprecision/cpp_int.hpp>

#include "tools/text/Refusal.h"
#include "tools/text/quantities.h"

namespace tools {
namespace {

constexpr std::string_view kUnits[] = {"s", "ms", "us", "ns", "ps", "fs"};
constexpr int kFinestExponent = 15;
constexpr int kPicoseconds = 12;

struct Division {
  std::uint64_t quotient = 0;
  std::uint64_t rest = 0;
};

// 10^`power` / `divisor`, digit by digit as by hand; `divisor` is at most 10^18.
Division dividePowerOfTen(unsigned power, std::uint64_t divisor) {
  Division result{1 / divisor, 1 % divisor};
  for (unsigned digit = 0; digit < power; ++digit) {
    result.quotient = 10 * result.quotient + 10 * result.rest / divisor;
    result.rest = 10 * result.rest % divisor;
  }
  return result;
}

// `a` * `b` / `divisor`, to the nearest.
boost::multiprecision::uint128_t scale(std::uint64_t a, std::uint64_t b, std::uint64_t divisor) {
  using boost::multiprecision::uint128_t;
  return (uint128_t(a) * b + divisor / 2) / divisor;
}

}  // namespace

VcdClock::VcdClock(double sampleRateHz, std::uint64_t endSample, const std::string& path) {
  const DecimalNumber rateHz = toDecimal(sampleRateHz);
  divisor_ = rateHz.digits;
  const auto setUnit = [&](int exponent) {
    exponent_ = exponent;
    const Division period = dividePowerOfTen(rateHz.decimals + static_cast<unsigned>(exponent), divisor_);
    periodTicks_ = period.quotient;
    rest_ = period.rest;
    return rest_ == 0;
  };
  int exponent = 0;
  while (exponent <= kFinestExponent && !setUnit(exponent)) ++exponent;
  if (exponent > kFinestExponent) setUnit(kPicoseconds);
  const auto last = boost::multiprecision::uint128_t(periodTicks_) * endSample + scale(endSample, rest_, divisor_);
  if (last <= INT64_MAX) return;
  throw Refusal(
      path + ": this format cannot hold " + formatCount(endSample) + " samples: their time is more than 2^63 " + unit(),
      "Play less, or use another format.");
}

std::string VcdClock::unit() const {
  const char* const factors[] = {"1", "100", "10"};
  return std::string(factors[exponent_ % 3]) + " " + std::string(kUnits[(exponent_ + 2) / 3]);
}

std::uint64_t VcdClock::ticks(std::uint64_t sample) const {
  const std::uint64_t whole = periodTicks_ * sample;
  return rest_ == 0 ? whole : whole + static_cast<std::uint64_t>(scale(sample, rest_, divisor_));
}

}  // namespace tools
