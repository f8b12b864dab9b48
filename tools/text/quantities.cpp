#include "tools/text/quantities.h"

#include <algorithm>
#include <array>
#include <boost/multiprecision/cpp_int.hpp>
#include <charconv>
#include <cmath>
#include <limits>

#include "tools/text/words.h"

namespace tools {
namespace {

struct Prefix {
  std::string_view text;
  int exponent;
};
constexpr std::array<Prefix, 11> kPrefixes = {{{"f", -15},
                                               {"p", -12},
                                               {"n", -9},
                                               {"\u00b5", -6},
                                               {"u", -6},
                                               {"m", -3},
                                               {"", 0},
                                               {"k", 3},
                                               {"M", 6},
                                               {"G", 9},
                                               {"T", 12}}};
constexpr double kLeastWithPrefix = 1e-15;
constexpr double kLeastWithoutPrefix = 1e15;
constexpr std::uint64_t kMostSamples = UINT64_MAX - 1;

std::optional<int> findExponent(std::string_view suffix, std::string_view unit, bool barePrefix) {
  for (const Prefix& prefix : kPrefixes) {
    if (!suffix.starts_with(prefix.text)) continue;
    const std::string_view rest = suffix.substr(prefix.text.size());
    const bool isUnit = !unit.empty() && rest == unit;
    if (isUnit || (rest.empty() && (barePrefix || prefix.text.empty()))) return prefix.exponent;
  }
  return std::nullopt;
}

// By an exact power of ten.
double scaleByPowerOfTen(double value, int exponent) {
  return exponent < 0 ? value / std::pow(10.0, -exponent) : value * std::pow(10.0, exponent);
}

std::string_view skipPlus(std::string_view text) { return text.starts_with('+') ? text.substr(1) : text; }

// Room for the longest: every double has that many digits in front of the point at most.
std::string fixed(double value, int decimals) {
  std::array<char, std::numeric_limits<double>::max_exponent10 + 32> buffer;
  const auto end =
      std::to_chars(buffer.data(), buffer.data() + buffer.size(), value, std::chars_format::fixed, decimals);
  return {buffer.data(), end.ptr};
}

// "1.5e+300", "inf" or "nan".
std::string withExponent(double value) {
  std::array<char, 32> buffer;
  const auto end = std::to_chars(buffer.data(), buffer.data() + buffer.size(), value, std::chars_format::general, 4);
  return {buffer.data(), end.ptr};
}

std::string trimZeros(std::string text) {
  if (text.find('.') == std::string::npos) return text;
  text.erase(text.find_last_not_of('0') + 1);
  if (text.back() == '.') text.pop_back();
  return text;
}

// The number times a power of ten, read as one, since multiplying rounds twice: 1.005 times 1000 is less than 1005.
std::optional<double> readScaled(std::string_view number, int exponent) {
  const std::size_t mark = std::min(number.find_first_of("eE"), number.size());
  const std::string_view digits = mark < number.size() ? skipPlus(number.substr(mark + 1)) : std::string_view("0");
  const auto own = parseInteger<std::int32_t>(digits);
  if (!own) return 0;  // of a zero alone so large an exponent can be read
  const std::string text = std::string(number.substr(0, mark)) + "e" + std::to_string(std::int64_t{*own} + exponent);
  double value = 0;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), value);
  return error == std::errc() ? std::optional(value) : std::nullopt;
}

using ExactInteger = boost::multiprecision::cpp_int;

constexpr int kMostDigits = 60;              // of a number; what follows cannot matter below 2^64
constexpr std::int64_t kMostExponent = 100;  // of ten, likewise

// `digits` * 10^`exponent`, written in the first `length` bytes.
struct ExactNumber {
  ExactInteger digits = 0;
  std::int64_t exponent = 0;
  std::size_t length = 0;
};

// Of a text that parseQuantity reads. A digit too far behind to be kept is noted as one that is not 0.
ExactNumber readExactly(std::string_view text) {
  text = skipPlus(text);
  double ignored = 0;
  ExactNumber number;
  number.length =
      static_cast<std::size_t>(std::from_chars(text.data(), text.data() + text.size(), ignored).ptr - text.data());
  const std::size_t mark = std::min(text.substr(0, number.length).find_first_of("eE"), number.length);
  bool isFraction = false;
  int kept = 0;
  for (const char c : text.substr(0, mark)) {
    if (c == '.') isFraction = true;
    if (c < '0' || c > '9') continue;
    if (kept < kMostDigits) {
      number.digits = 10 * number.digits + (c - '0');
      if (number.digits != 0) ++kept;
      if (isFraction) --number.exponent;
    } else {
      if (c != '0' && number.digits % 10 == 0) ++number.digits;
      if (!isFraction) ++number.exponent;
    }
  }
  if (mark < number.length) {
    const auto exponent = parseInteger<std::int32_t>(skipPlus(text.substr(mark + 1, number.length - mark - 1)));
    number.exponent += exponent.value_or(0);  // one that is too long is that of a zero
  }
  return number;
}

}  // namespace

std::optional<double> parseNumber(std::string_view text) { return parseQuantity(text, "", false); }

std::optional<double> parseQuantity(std::string_view text, std::string_view unit, bool barePrefix) {
  text = skipPlus(text);
  double value = 0;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), value);
  if (error != std::errc() || !std::isfinite(value)) return std::nullopt;
  const auto length = static_cast<std::size_t>(end - text.data());
  const auto exponent = findExponent(text.substr(length), unit, barePrefix);
  if (!exponent) return std::nullopt;
  return *exponent == 0 ? value : readScaled(text.substr(0, length), *exponent);
}

DecimalNumber toDecimal(double value) {
  std::array<char, 32> text;
  const char* const end =
      std::to_chars(text.data(), text.data() + text.size(), value, std::chars_format::scientific).ptr;
  DecimalNumber number;
  int decimals = 0;
  const char* c = text.data();
  for (bool isFraction = false; *c != 'e'; ++c) {
    if (*c == '.') {
      isFraction = true;
      continue;
    }
    number.digits = 10 * number.digits + static_cast<std::uint64_t>(*c - '0');
    if (isFraction) ++decimals;
  }
  ++c;
  int exponent = 0;
  std::from_chars(*c == '+' ? c + 1 : c, end, exponent);
  for (decimals -= exponent; decimals < 0; ++decimals) number.digits *= 10;
  number.decimals = static_cast<unsigned>(decimals);
  return number;
}

SampleCount readSampleCount(std::string_view text, double sampleRateHz) {
  const bool isTime = text.ends_with('s');
  const auto value = parseQuantity(text, isTime ? "s" : "");
  if (!value) return {0, CountFault::kNoNumber};
  if (*value < 0) return {0, CountFault::kNegative};
  ExactNumber number = readExactly(text);
  const auto prefix = findExponent(skipPlus(text).substr(number.length), isTime ? "s" : "", true);
  const DecimalNumber rateHz = isTime ? toDecimal(sampleRateHz) : DecimalNumber{1, 0};
  number.exponent += *prefix - static_cast<std::int64_t>(rateHz.decimals);
  number.digits *= rateHz.digits;
  if (number.digits == 0) return {};
  if (number.exponent > kMostExponent) return {0, CountFault::kTooLarge};
  if (number.exponent < -kMostExponent) return {0, isTime ? CountFault::kNone : CountFault::kFraction};
  ExactInteger power = 1;
  for (std::int64_t left = std::abs(number.exponent); left > 0; --left) power *= 10;
  const ExactInteger divisor = number.exponent < 0 ? power : ExactInteger(1);
  const ExactInteger product = number.exponent > 0 ? ExactInteger(number.digits * power) : number.digits;
  if (!isTime && product % divisor != 0) return {0, CountFault::kFraction};
  const ExactInteger count = (2 * product + divisor) / (2 * divisor);
  if (count > kMostSamples) return {0, CountFault::kTooLarge};
  return {static_cast<std::uint64_t>(count), CountFault::kNone};
}

std::optional<std::uint64_t> parseSampleCount(std::string_view text, double sampleRateHz) {
  const SampleCount count = readSampleCount(text, sampleRateHz);
  return count.fault == CountFault::kNone ? std::optional(count.samples) : std::nullopt;
}

std::string formatQuantity(double value, std::string_view unit) {
  const double magnitude = std::abs(value);
  const bool hasPrefix = magnitude == 0 || (magnitude >= kLeastWithPrefix && magnitude < kLeastWithoutPrefix);
  if (!hasPrefix) return withExponent(value) + " " + std::string(unit);
  int exponent = 0;
  if (magnitude > 0) exponent = static_cast<int>(std::floor(std::log10(magnitude * (1 + 1e-9)) / 3)) * 3;
  exponent = std::min(12, std::max(-15, exponent));
  const double mantissa = scaleByPowerOfTen(value, -exponent);
  const int decimals = std::abs(mantissa) >= 99.95 ? 1 : std::abs(mantissa) >= 9.995 ? 2 : 3;
  std::string text = trimZeros(fixed(mantissa, decimals)) + " ";
  for (const Prefix& prefix : kPrefixes) {
    if (prefix.exponent != exponent) continue;
    text += prefix.text;
    break;
  }
  return text += unit;
}

std::string formatCount(std::uint64_t count) {
  const std::string digits = std::to_string(count);
  std::string text;
  for (std::size_t i = 0; i < digits.size(); ++i) {
    if (i > 0 && (digits.size() - i) % 3 == 0) text += "\u2009";
    text += digits[i];
  }
  return text;
}

std::string formatNumber(double value) {
  std::array<char, 32> buffer;
  return {buffer.data(), std::to_chars(buffer.data(), buffer.data() + buffer.size(), value).ptr};
}

}  // namespace tools
