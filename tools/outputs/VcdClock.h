// The times of value-change dumps: whole numbers of a unit, exact where the unit allows, and never off by more than
// half of one. A value.
#pragma once

#include <cstdint>
#include <string>

namespace tools {

class VcdClock {
 public:
  // The unit is the coarsest power of ten in which the sample period is a whole number; where there is none it is the
  // picosecond, and times are rounded. Throws Refusal, naming `path`, where the time of `endSample` does not fit the 63
  // bits that readers of such files take.
  VcdClock(double sampleRateHz, std::uint64_t endSample, const std::string& path);

  std::string unit() const;  // "100 ps"
  std::uint64_t ticks(std::uint64_t sample) const;

 private:
  // A sample takes periodTicks_ + rest_ / divisor_ ticks.
  std::uint64_t periodTicks_ = 0;
  std::uint64_t rest_ = 0;
  std::uint64_t divisor_ = 1;
  int exponent_ = 0;  // a tick is 10^-exponent_ seconds
};

}  // namespace tools
