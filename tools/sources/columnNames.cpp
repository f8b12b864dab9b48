#include "tools/sources/columnNames.h"

#include <algorithm>

#include "tools/text/characters.h"

namespace tools {
namespace {

constexpr std::string_view kTimeNames[] = {
    "time",    "times", "t",     "s",      "sec",     "secs", "second",   "seconds",   "ms",     "us",
    "\u00b5s", "ns",    "x",     "x-axis", "index",   "idx",  "i",        "n",         "no",     "nr",
    "#",       "row",   "point", "sample", "samples", "date", "datetime", "timestamp", "elapsed"};
constexpr std::string_view kTimeUnits[] = {"s",    "ms", "us",  "\u00b5s", "ns",      "ps",      "fs",  "sec",
                                           "secs", "h",  "min", "second",  "seconds", "samples", "time"};
constexpr std::string_view kUnits[] = {"s",      "sec",    "second", "seconds", "min",     "h",    "v",       "volt",
                                       "volts",  "vpp",    "vrms",   "a",       "amp",     "amps", "ampere",  "w",
                                       "watt",   "hz",     "db",     "dbm",     "dbv",     "deg",  "rad",     "c",
                                       "k",      "pa",     "bar",    "n",       "g",       "m",    "t",       "ohm",
                                       "\u03c9", "\u2126", "%",      "\u00b0",  "\u00b0c", "-",    "samples", "a.u."};
constexpr std::string_view kPrefixes[] = {"", "f", "p", "n", "u", "\u00b5", "\u03bc", "m", "k", "g", "t"};
constexpr std::string_view kUnitMarks = " ([{_/,:)]}";

template <typename Words>
bool contains(const Words& words, std::string_view word) {
  return std::ranges::find(words, word) != std::end(words);
}

std::string lowerCase(std::string_view text) {
  std::string lower(text);
  std::ranges::transform(lower, lower.begin(), toLower);
  return lower;
}

std::string_view trimMarks(std::string_view text) {
  const std::size_t first = text.find_first_not_of(kUnitMarks);
  if (first == std::string_view::npos) return {};
  return text.substr(first, text.find_last_not_of(kUnitMarks) - first + 1);
}

bool isUnit(std::string_view text) {
  const std::string lower = lowerCase(trimMarks(text));
  return std::ranges::any_of(kPrefixes, [&lower](std::string_view prefix) {
    return lower.starts_with(prefix) && contains(kUnits, std::string_view(lower).substr(prefix.size()));
  });
}

}  // namespace

bool namesTime(std::string_view name) {
  const std::string lower = lowerCase(name);
  const std::string_view base = std::string_view(lower).substr(0, lower.find_first_of(kUnitMarks));
  const std::string_view unit = trimMarks(std::string_view(lower).substr(base.size()));
  return contains(kTimeNames, base) && (unit.empty() || contains(kTimeUnits, unit));
}

bool areUnits(const std::vector<std::string>& names) {
  return std::ranges::all_of(names, [](const std::string& name) { return name.empty() || isUnit(name); }) &&
         std::ranges::any_of(names, [](const std::string& name) { return !name.empty(); });
}

std::string toUtf8(std::string_view text) {
  if (!findInvalidUtf8(text)) return std::string(text);
  std::string converted;
  for (const char c : text) {
    const auto byte = static_cast<unsigned char>(c);
    if (byte >= 0x80) converted += static_cast<char>(0xC0 | byte >> 6);
    converted += static_cast<char>(byte >= 0x80 ? 0x80 | (byte & 0x3F) : byte);
  }
  return converted;
}

}  // namespace tools
