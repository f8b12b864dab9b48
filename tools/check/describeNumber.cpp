#include "tools/check/describeNumber.h"

#include <algorithm>
#include <cmath>

#include "tools/text/quantities.h"
#include "tools/text/words.h"

namespace tools {
namespace {

constexpr double kGreatest = 2147483647;

bool isDigit(char c) { return c >= '0' && c <= '9'; }

std::string quoted(std::string_view text) { return "`" + std::string(text) + "`"; }

std::optional<std::string> digitsOf(double value) {
  if (!(value >= 0 && value <= kGreatest) || value != std::floor(value)) return std::nullopt;
  return std::to_string(static_cast<std::uint64_t>(value));
}

NumberAdvice advise(std::string message, const std::optional<std::string>& digits, bool isCertain) {
  if (!digits) return {std::move(message), "Numbers are decimal and whole, from 0 to 2147483647.", "", false};
  return {std::move(message), "Write " + *digits + ".", *digits, isCertain};
}

std::optional<NumberAdvice> describeTime(std::string_view text, double sampleRateHz) {
  const auto seconds = text.ends_with('s') ? parseQuantity(text, "s", false) : std::nullopt;
  if (!seconds) return std::nullopt;
  const auto samples = parseSampleCount(text, sampleRateHz);
  NumberAdvice advice = {quoted(text) + " is a time, and scripts count samples", "", "", false};
  if (!samples || static_cast<double>(*samples) > kGreatest) return advice;
  advice.replacement = std::to_string(*samples);
  advice.help = std::string(text) + " is " + advice.replacement + " samples at " + formatQuantity(sampleRateHz, "S/s") +
                "; times need the sample rate, write samples.";
  return advice;
}

std::optional<NumberAdvice> describeRadix(std::string_view text) {
  const bool isHexadecimal = text.starts_with("0x") || text.starts_with("0X");
  const bool isBinary = text.starts_with("0b") || text.starts_with("0B");
  if (!isHexadecimal && !isBinary) return std::nullopt;
  const auto value = parseInteger<std::uint64_t>(text.substr(2), isHexadecimal ? 16 : 2);
  if (!value) return std::nullopt;
  return advise(
      quoted(text) + (isHexadecimal ? " is hexadecimal" : " is binary") + ", and numbers in scripts are decimal",
      digitsOf(static_cast<double>(*value)), true);
}

// "1_000", "1'000".
std::optional<NumberAdvice> describeGroups(std::string_view text) {
  std::string digits(text);
  std::erase_if(digits, [](char c) { return c == '_' || c == '\''; });
  if (digits.size() == text.size() || !std::ranges::all_of(digits, isDigit) || !isDigit(text.back()))
    return std::nullopt;
  const auto value = parseInteger<std::uint64_t>(digits);
  return advise(quoted(text) + " has more than digits", value ? digitsOf(static_cast<double>(*value)) : std::nullopt,
                true);
}

std::optional<NumberAdvice> describeSign(std::string_view text) {
  if (text.front() != '-' && text.front() != '+') return std::nullopt;
  const auto value = parseInteger<std::uint64_t>(text.substr(1));
  if (!value) return std::nullopt;
  if (text.front() == '-') {
    return NumberAdvice{quoted(text) + " is negative", "Numbers count from 0 to 2147483647.", "", false};
  }
  return advise(quoted(text) + " has a sign", digitsOf(static_cast<double>(*value)), true);
}

// "10*100", "64+8": whole numbers with one sign between.
std::optional<NumberAdvice> describeSum(std::string_view text) {
  const std::size_t sign = text.find_first_of("*+-", 1);
  if (sign == std::string_view::npos) return std::nullopt;
  const auto left = parseInteger<std::uint32_t>(text.substr(0, sign));
  const auto right = parseInteger<std::uint32_t>(text.substr(sign + 1));
  if (!left || !right) return std::nullopt;
  const double a = *left;
  const double b = *right;
  const double value = text[sign] == '*' ? a * b : text[sign] == '+' ? a + b : a - b;
  return advise("nothing is computed in a script: " + quoted(text), digitsOf(value), false);
}

// "1e6", "100.5", "1k".
std::optional<NumberAdvice> describeDecimal(std::string_view text) {
  const auto value = parseQuantity(text, "");
  if (!value) return std::nullopt;
  const auto digits = digitsOf(*value);
  if (digits) return advise(quoted(text) + " is not written in digits alone", digits, parseNumber(text).has_value());
  if (*value >= 0 && *value < kGreatest) {
    return NumberAdvice{quoted(text) + " is not whole",
                        "Write " + *digitsOf(std::floor(*value)) + " or " + *digitsOf(std::ceil(*value)) + ".", "",
                        false};
  }
  return advise(quoted(text) + " is no number that a script can hold", std::nullopt, false);
}

std::optional<NumberAdvice> describeSize(std::string_view text) {
  if (!std::ranges::all_of(text, isDigit)) return std::nullopt;
  return NumberAdvice{quoted(text) + " is too large", "Numbers go from 0 to 2147483647.", "", false};
}

// "100;"
std::optional<NumberAdvice> describeTail(std::string_view text) {
  const std::size_t digits = std::min(text.find_first_not_of("0123456789"), text.size());
  if (digits == 0 || text.substr(digits) != ";") return std::nullopt;
  return NumberAdvice{"`;` ends nothing in a script",
                      "Parts stand apart by blanks and lines: write " + std::string(text.substr(0, digits)) + ".",
                      std::string(text.substr(0, digits)), true};
}

}  // namespace

std::optional<NumberAdvice> describeNumber(std::string_view text, double sampleRateHz) {
  if (text.empty()) return std::nullopt;
  if (auto advice = describeSize(text)) return advice;
  if (auto advice = describeTime(text, sampleRateHz)) return advice;
  if (auto advice = describeRadix(text)) return advice;
  if (auto advice = describeGroups(text)) return advice;
  if (auto advice = describeSign(text)) return advice;
  if (auto advice = describeSum(text)) return advice;
  if (auto advice = describeTail(text)) return advice;
  return describeDecimal(text);
}

}  // namespace tools
