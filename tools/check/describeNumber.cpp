#include "tools/check/describeNumber.h"

#include <algorithm>
#include <cmath>

#include "tools/text/quantities.h"
#include "tools/text/words.h"

namespace tools {
namespace {

constexpr double kGreatest = 2147483647;

bool isDigit(char c) { return c >= '0' && c <= '9'; }

std::optional<std::string> digitsOf(double value) {
  if (!(value >= 0 && value <= kGreatest) || value != std::floor(value)) return std::nullopt;
  return std::to_string(static_cast<std::uint64_t>(value));
}

class NumberDescriber {
 public:
  NumberDescriber(std::string_view text, double sampleRateHz, Diagnostic& diagnostic)
      : text_(text), quoted_("`" + std::string(text) + "`"), sampleRateHz_(sampleRateHz), diagnostic_(diagnostic) {}

  std::optional<NumberAdvice> describe() const {
    if (auto advice = describeSize()) return advice;
    if (auto advice = describeTime()) return advice;
    if (auto advice = describeRadix()) return advice;
    if (auto advice = describeGroups()) return advice;
    if (auto advice = describeSign()) return advice;
    if (auto advice = describeSum()) return advice;
    if (auto advice = describeTail()) return advice;
    return describeDecimal();
  }

 private:
  NumberAdvice advise(MessageKind kind, const std::optional<std::string>& digits, bool isCertain) const {
    say(diagnostic_, kind,
        {quoted_, digits ? "Write " + *digits + "." : "Numbers are decimal and whole, from 0 to 2147483647."});
    return digits ? NumberAdvice{*digits, isCertain} : NumberAdvice();
  }

  std::optional<NumberAdvice> describeSize() const {
    if (!std::ranges::all_of(text_, isDigit)) return std::nullopt;
    return advise(MessageKind::kTooLarge, std::nullopt, false);
  }

  std::optional<NumberAdvice> describeTime() const {
    const auto seconds = text_.ends_with('s') ? parseQuantity(text_, "s", false) : std::nullopt;
    if (!seconds) return std::nullopt;
    const auto samples = parseSampleCount(text_, sampleRateHz_);
    if (!samples || static_cast<double>(*samples) > kGreatest) {
      return advise(MessageKind::kLongTime, std::nullopt, false);
    }
    const std::string digits = std::to_string(*samples);
    say(diagnostic_, MessageKind::kTime, {quoted_, std::string(text_), digits, formatQuantity(sampleRateHz_, "S/s")});
    return NumberAdvice{digits, false};
  }

  std::optional<NumberAdvice> describeRadix() const {
    const bool isHexadecimal = text_.starts_with("0x") || text_.starts_with("0X");
    const bool isBinary = text_.starts_with("0b") || text_.starts_with("0B");
    if (!isHexadecimal && !isBinary) return std::nullopt;
    const auto value = parseInteger<std::uint64_t>(text_.substr(2), isHexadecimal ? 16 : 2);
    if (!value) return std::nullopt;
    return advise(isHexadecimal ? MessageKind::kHexadecimal : MessageKind::kBinary,
                  digitsOf(static_cast<double>(*value)), true);
  }

  // "1_000", "1'000".
  std::optional<NumberAdvice> describeGroups() const {
    std::string digits(text_);
    std::erase_if(digits, [](char c) { return c == '_' || c == '\''; });
    const bool isGrouped = digits.size() != text_.size() && std::ranges::all_of(digits, isDigit);
    if (!isGrouped || !isDigit(text_.back())) return std::nullopt;
    const auto value = parseInteger<std::uint64_t>(digits);
    return advise(MessageKind::kGroups, value ? digitsOf(static_cast<double>(*value)) : std::nullopt, true);
  }

  std::optional<NumberAdvice> describeSign() const {
    if (text_.front() != '-' && text_.front() != '+') return std::nullopt;
    const auto value = parseInteger<std::uint64_t>(text_.substr(1));
    if (!value) return std::nullopt;
    if (text_.front() == '-') return advise(MessageKind::kNegative, std::nullopt, false);
    return advise(MessageKind::kSigned, digitsOf(static_cast<double>(*value)), true);
  }

  // "10*100", "64+8": whole numbers with one sign between.
  std::optional<NumberAdvice> describeSum() const {
    const std::size_t sign = text_.find_first_of("*+-", 1);
    if (sign == std::string_view::npos) return std::nullopt;
    const auto left = parseInteger<std::uint32_t>(text_.substr(0, sign));
    const auto right = parseInteger<std::uint32_t>(text_.substr(sign + 1));
    if (!left || !right) return std::nullopt;
    const double a = *left;
    const double b = *right;
    const double value = text_[sign] == '*' ? a * b : text_[sign] == '+' ? a + b : a - b;
    return advise(MessageKind::kSum, digitsOf(value), false);
  }

  // "100;"
  std::optional<NumberAdvice> describeTail() const {
    const std::size_t count = std::min(text_.find_first_not_of("0123456789"), text_.size());
    if (count == 0 || text_.substr(count) != ";") return std::nullopt;
    const std::string digits(text_.substr(0, count));
    say(diagnostic_, MessageKind::kNumberTail, {digits});
    return NumberAdvice{digits, true};
  }

  // "1e6", "100.5", "1k".
  std::optional<NumberAdvice> describeDecimal() const {
    const auto value = parseQuantity(text_, "");
    if (!value) return std::nullopt;
    const auto digits = digitsOf(*value);
    if (digits) return advise(MessageKind::kNotDigits, digits, parseNumber(text_).has_value());
    if (!(*value >= 0 && *value < kGreatest)) return advise(MessageKind::kUnheldNumber, std::nullopt, false);
    say(diagnostic_, MessageKind::kNotWhole, {quoted_, *digitsOf(std::floor(*value)), *digitsOf(std::ceil(*value))});
    return NumberAdvice();
  }

  std::string_view text_;
  std::string quoted_;
  double sampleRateHz_;
  Diagnostic& diagnostic_;
};

}  // namespace

std::optional<NumberAdvice> describeNumber(std::string_view text, double sampleRateHz, Diagnostic& diagnostic) {
  if (text.empty()) return std::nullopt;
  return NumberDescriber(text, sampleRateHz, diagnostic).describe();
}

}  // namespace tools
