// The numbers of an axis: where its ticks are and what stands at them.
#pragma once

#include <string>
#include <vector>

namespace tools {

struct Tick {
  double value;
  std::string label;
};

struct Axis {
  double first = 0;  // value at the axis's start
  double last = 1;   // and at its end; greater than first
  std::vector<Tick> ticks;
  std::string unit;  // of the labels; empty: none

  // Where `value` lies between first (0) and last (1).
  double place(double value) const { return (value - first) / (last - first); }
};

// An axis of times with at most about `maxTicks` ticks at 1, 2 or 5 times a power of ten, labelled in
// the largest unit in which the end is at least 1.
Axis makeTimeAxis(double firstSeconds, double lastSeconds, int maxTicks);

// An axis for levels from `lowest` to `highest`, fractions of full scale: with 0 on it, some room at both ends, and
// from -1 to 1 where the levels are all 0.
Axis makeLevelAxis(double lowest, double highest, int maxTicks);

}  // namespace tools
