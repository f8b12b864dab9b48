#include "simulator/DeviceFaults.h"

#include <algorithm>
#include <cstdarg>
#include <cstdio>

namespace simulator {

void DeviceFaults::record(std::int32_t code, std::uint32_t address, std::uint64_t sample, const char* text, ...) {
  if (const std::uint64_t index = count_++; index < kept_.size()) {
    ktSim_DeviceFault& fault = kept_[index];
    fault = {code, address, sample, {}};
    std::va_list values;
    va_start(values, text);
    std::vsnprintf(fault.text, sizeof fault.text, text, values);
    va_end(values);
  }
}

const ktSim_DeviceFault* DeviceFaults::find(std::uint64_t index) const {
  return index < std::min<std::uint64_t>(count_, kept_.size()) ? &kept_[index] : nullptr;
}

}  // namespace simulator
