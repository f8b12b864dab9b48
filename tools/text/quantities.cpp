#include "tools/text/quantities.h"

#include <array>
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
constexpr double kLargestExactCount = 9007199254740992.0;  // 2^53

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

std::optional<std::uint64_t> parseSampleCount(std::string_view text, double sampleRateHz) {
  const bool isTime = text.ends_with('s');
  std::optional<double> count = isTime ? parseQuantity(text, "s") : parseQuantity(text, "");
  if (!count) return std::nullopt;
  if (isTime) *count = std::round(*count * sampleRateHz);
  if (*count < 0 || *count > kLargestExactCount || *count != std::floor(*count)) return std::nullopt;
  return static_cast<std::uint64_t>(*count);
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
