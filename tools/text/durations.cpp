#include "tools/text/durations.h"

#include <algorithm>
#include <boost/multiprecision/cpp_int.hpp>
#include <charconv>

#include "tools/text/quantities.h"

namespace tools {
namespace {

using Integer = boost::multiprecision::cpp_int;

constexpr unsigned kMostDecimals = 30;
constexpr unsigned kRoundedDecimals = 15;
constexpr unsigned kFinestUnit = 15;
constexpr std::size_t kDigitsForPeople = 10;  // of what is not exact

// `digits` / 10^`decimals`.
struct Seconds {
  std::string digits;
  unsigned decimals = 0;
  bool isExact = true;
};

Integer powerOfTen(unsigned exponent) {
  Integer power = 1;
  for (; exponent > 0; --exponent) power *= 10;
  return power;
}

// Takes all factors of `prime` out of the number, and counts them.
unsigned takeOut(unsigned prime, Integer& number) {
  unsigned count = 0;
  for (; number % prime == 0; number /= prime) ++count;
  return count;
}

Seconds divide(std::uint64_t samples, double sampleRateHz) {
  const DecimalNumber rateHz = toDecimal(sampleRateHz);
  const Integer dividend = samples * powerOfTen(rateHz.decimals);
  const Integer common = boost::multiprecision::gcd(dividend, Integer(rateHz.digits));
  Integer rest = rateHz.digits / common;
  const unsigned decimals = std::max(takeOut(2, rest), takeOut(5, rest));
  Seconds seconds;
  seconds.isExact = rest == 1 && decimals <= kMostDecimals;
  seconds.decimals = seconds.isExact ? decimals : kRoundedDecimals;
  const Integer scaled = 2 * dividend * powerOfTen(seconds.decimals) + rateHz.digits;
  seconds.digits = Integer(scaled / (2 * Integer(rateHz.digits))).str();
  return seconds;
}

// With a point before the last `decimals` digits.
std::string placePoint(std::string digits, unsigned decimals) {
  if (digits.size() <= decimals) digits.insert(0, decimals + 1 - digits.size(), '0');
  if (decimals == 0) return digits;
  digits.insert(digits.size() - decimals, 1, '.');
  digits.erase(digits.find_last_not_of('0') + 1);
  if (digits.back() == '.') digits.pop_back();
  return digits;
}

std::string groupWhole(const std::string& number) {
  std::uint64_t whole = 0;
  const auto [end, error] = std::from_chars(number.data(), number.data() + number.size(), whole);
  return error == std::errc() ? formatCount(whole) + std::string(end, number.data() + number.size()) : number;
}

}  // namespace

std::string secondsOf(std::uint64_t samples, double sampleRateHz) {
  const Seconds seconds = divide(samples, sampleRateHz);
  return placePoint(seconds.digits, seconds.decimals);
}

std::string formatDuration(std::uint64_t samples, double sampleRateHz) {
  constexpr const char* kUnits[] = {" s", " ms", " \u00b5s", " ns", " ps", " fs"};
  if (samples == 0) return "0 s";
  Seconds seconds = divide(samples, sampleRateHz);
  unsigned unit = 0;
  while (unit < kFinestUnit && seconds.digits.size() + unit <= seconds.decimals) unit += 3;
  if (seconds.decimals < unit) {
    seconds.digits.append(unit - seconds.decimals, '0');
    seconds.decimals = unit;
  }
  std::string number = placePoint(seconds.digits, seconds.decimals - unit);
  if (!seconds.isExact) number.resize(std::min(number.size(), std::max(number.find('.'), kDigitsForPeople + 1)));
  if (number.back() == '.') number.pop_back();
  return (seconds.isExact ? "" : "about ") + groupWhole(number) + kUnits[unit / 3];
}

}  // namespace tools
