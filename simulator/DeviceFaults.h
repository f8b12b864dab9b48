// What went wrong inside one generator, as its designer would read it from a debug port: the first faults with their
// words, and the number of all.
#pragma once

#include <array>
#include <cstdint>

#include "ktorba/simulator.h"

namespace simulator {

class DeviceFaults {
 public:
  // `text` in the manner of printf; no allocation.
  [[gnu::format(printf, 5, 6)]] void record(std::int32_t code, std::uint32_t address, std::uint64_t sample,
                                            const char* text, ...);
  std::uint64_t count() const { return count_; }
  // Null when the fault was not kept.
  const ktSim_DeviceFault* find(std::uint64_t index) const;
  void clear() { count_ = 0; }

 private:
  std::array<ktSim_DeviceFault, 64> kept_{};
  std::uint64_t count_ = 0;
};

}  // namespace simulator
