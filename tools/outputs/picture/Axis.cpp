#include "tools/outputs/picture/Axis.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>
#include <cstdint>

namespace tools {
namespace {

constexpr double kRoomAtEnds = 0.08;  // of the levels' span

struct TimeUnit {
  double seconds;
  const char* name;
};
constexpr TimeUnit kTimeUnits[] = {{1, "s"}, {1e-3, "ms"}, {1e-6, "\u00b5s"}, {1e-9, "ns"}, {1e-12, "ps"}};

double niceStep(double span, int maxTicks) {
  const double least = span / maxTicks;
  const double power = std::pow(10, std::floor(std::log10(least)));
  for (const double factor : {1.0, 2.0, 5.0}) {
    if (factor * power >= least * (1 - 1e-9)) return factor * power;
  }
  return 10 * power;
}

std::string label(double value, double step) {
  const int decimals = std::max(0, static_cast<int>(-std::floor(std::log10(step) + 1e-9)));
  std::array<char, 64> buffer;
  const double shown = std::abs(value) < step / 2 ? 0 : value;
  std::string text(
      buffer.data(),
      std::to_chars(buffer.data(), buffer.data() + buffer.size(), shown, std::chars_format::fixed, decimals).ptr);
  if (text.front() == '-') text.replace(0, 1, "\u2212");
  return text;
}

// Ticks of the axis's values in units of `unit`.
void addTicks(Axis& axis, double unit, int maxTicks) {
  const double step = niceStep((axis.last - axis.first) / unit, maxTicks);
  const auto firstIndex = static_cast<std::int64_t>(std::ceil(axis.first / unit / step - 1e-6));
  const auto lastIndex = static_cast<std::int64_t>(std::floor(axis.last / unit / step + 1e-6));
  for (std::int64_t i = firstIndex; i <= lastIndex; ++i) {
    const double value = static_cast<double>(i) * step;
    axis.ticks.push_back({value * unit, label(value, step)});
  }
}

}  // namespace

Axis makeTimeAxis(double firstSeconds, double lastSeconds, int maxTicks) {
  Axis axis;
  axis.first = firstSeconds;
  axis.last = lastSeconds;
  const TimeUnit* unit = std::find_if(std::begin(kTimeUnits), std::end(kTimeUnits),
                                      [lastSeconds](const TimeUnit& u) { return lastSeconds >= u.seconds; });
  if (unit == std::end(kTimeUnits)) --unit;
  axis.unit = unit->name;
  addTicks(axis, unit->seconds, maxTicks);
  return axis;
}

Axis makeLevelAxis(double lowest, double highest, int maxTicks) {
  Axis axis;
  axis.first = std::min(lowest, 0.0);
  axis.last = std::max(highest, 0.0);
  if (axis.first == axis.last) {
    axis.first = -1;
    axis.last = 1;
  }
  const double room = kRoomAtEnds * (axis.last - axis.first);
  if (lowest < 0) axis.first -= room;
  axis.last += room;
  if (lowest >= 0) axis.first -= room;
  addTicks(axis, 1, maxTicks);
  return axis;
}

}  // namespace tools
