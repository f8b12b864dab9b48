// Numbers with SI prefixes, read from arguments and written for people. Independent of the locale.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace tools {

// The whole of `text` as a finite decimal number ("1e6", "-.5", "+2"), or nothing.
std::optional<double> parseNumber(std::string_view text);

// As parseNumber, or with an SI prefix (f p n u m k M G T), the unit, or both behind it: with the unit "s", "20ms" is
// 0.02. A prefix that stands without its unit is read only when `barePrefix`.
std::optional<double> parseQuantity(std::string_view text, std::string_view unit, bool barePrefix = true);

// A number as written: `digits` / 10^`decimals`.
struct DecimalNumber {
  std::uint64_t digits = 0;
  unsigned decimals = 0;
};

// The shortest decimal number that reads back as `value`, which is what somebody wrote; from 1e-3 to 1e17.
DecimalNumber toDecimal(double value);

enum class CountFault : std::uint8_t { kNone, kNoNumber, kNegative, kFraction, kTooLarge };

struct SampleCount {
  std::uint64_t samples = 0;
  CountFault fault = CountFault::kNone;
};

// A number of samples: a plain one ("1000", "1M"), or a time ("20ms") at that sample rate, from 1e-3 to 1e17, rounded
// to the nearest. Exact; 2^64 - 2 is the most.
SampleCount readSampleCount(std::string_view text, double sampleRateHz);

// The same, or nothing where that has a fault.
std::optional<std::uint64_t> parseSampleCount(std::string_view text, double sampleRateHz);

// `value` with four significant digits and a prefix: (0.0123, "s") is "12.3 ms". Where no prefix goes so far it has an
// exponent: "1e+300 s"; infinities and what is no number are "inf s" and "nan s".
std::string formatQuantity(double value, std::string_view unit);

// Digits in groups of three, parted by thin spaces: "12 345 678".
std::string formatCount(std::uint64_t count);

// The shortest text that reads back as `value`.
std::string formatNumber(double value);

}  // namespace tools
