#include "tools/sources/Scale.h"

#include <algorithm>
#include <array>

#include "tools/text/quantities.h"

namespace tools {
namespace {

constexpr std::string_view kPrefixes[] = {"f", "p", "n", "\u00b5", "u", "m", "k", "M", "G", "T"};
constexpr std::string_view kPrefixedUnits[] = {"V", "A", "W", "Vpp", "Vrms", "Hz",     "Pa",    "N",
                                               "C", "F", "J", "Ohm", "S",    "H",      "g",     "m",
                                               "s", "T", "K", "bar", "rad",  "\u2126", "\u03a9"};

bool isDigitOrSign(char c) { return (c >= '0' && c <= '9') || c == '.' || c == '+' || c == '-'; }

// What stands behind the number: "mV" of "500mV" and of "5e2mV".
std::string_view unitOf(std::string_view text) {
  const std::size_t lastDigit = text.find_last_of("0123456789.");
  return lastDigit == std::string_view::npos ? "" : text.substr(lastDigit + 1);
}

bool beginsLikePrefix(std::string_view unit) {
  return std::ranges::any_of(kPrefixes, [unit](std::string_view prefix) { return unit.starts_with(prefix); });
}

double readFullScale(Parameters& parameters) {
  const auto text = parameters.text("full-scale");
  if (!text) return 1;
  const auto value = parseWithAnyUnit(*text);
  if (!value || *value <= 0) parameters.refuseValue("full-scale", "a positive number such as 5, 5V or 500mV");
  return *value;
}

double readRateHz(Parameters& parameters, double otherwise) {
  const auto text = parameters.text("rate");
  if (!text) return otherwise;
  auto rateHz = parseQuantity(*text, "Hz");
  if (!rateHz) rateHz = parseQuantity(*text, "S/s");
  if (!rateHz || *rateHz <= 0) parameters.refuseValue("rate", "a rate such as 44100 or 20MHz");
  return *rateHz;
}

void checkScale(const Parameters& parameters, const Scale& scale) {
  const int said = scale.areCodes + scale.normalise + parameters.has("full-scale");
  if (said > 1) parameters.refuse("give only one of codes, full-scale and normalise");
  if (scale.resample && scale.recordedRateHz == 0) {
    parameters.refuse("the rate to resample from is not known", "Give the one that it was recorded at: rate=48kHz");
  }
}

}  // namespace

std::optional<double> parseWithAnyUnit(std::string_view text) {
  const std::string_view unit = unitOf(text);
  if (const auto value = parseQuantity(text, "")) return value;
  for (const std::string_view known : kPrefixedUnits) {
    if (const auto value = parseQuantity(text, known, false)) return value;
  }
  if (beginsLikePrefix(unit) || std::ranges::any_of(unit, isDigitOrSign)) return std::nullopt;
  return parseQuantity(text, unit, false);
}

Scale readScale(Parameters& parameters, double fileRateHz) {
  Scale scale;
  scale.areCodes = parameters.flag("codes");
  scale.fullScale = readFullScale(parameters);
  scale.normalise = parameters.flag("normalise");
  scale.gain = parameters.number("gain", 1);
  scale.offset = parameters.number("offset", 0);
  scale.recordedRateHz = readRateHz(parameters, fileRateHz);
  scale.resample = parameters.flag("resample");
  scale.isSaid = scale.areCodes || scale.normalise || parameters.has("full-scale");
  checkScale(parameters, scale);
  return scale;
}

}  // namespace tools
