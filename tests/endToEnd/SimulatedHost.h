// A host program in small: one simulated generator and one session on it, through the two public interfaces alone.
#pragma once

#include <gtest/gtest.h>

#include <cstdint>
#include <string>
#include <vector>

#include "ReferencePlayer.h"
#include "ktorba/ktorba.h"
#include "ktorba/simulator.h"

namespace endToEnd {

class SimulatedHost {
 public:
  explicit SimulatedHost(const ktSim_Traits& traits);
  ~SimulatedHost();
  SimulatedHost(const SimulatedHost&) = delete;
  SimulatedHost& operator=(const SimulatedHost&) = delete;

  // Writes `count` of the waveform's samples from `first` on, at its present write position.
  std::int32_t write(const std::string& name, const Samples& samples, std::size_t first, std::size_t count);
  // Plays up to `count` samples.
  Played advance(std::uint64_t count);

  std::uint32_t session = 0;
  std::uint32_t generator = 0;

 private:
  ktSim_Fpga fpga_{};
  ktSim_Traits traits_;
};

// The call succeeds.
#define EXPECT_OK(call) EXPECT_EQ(call, 0) << #call

}  // namespace endToEnd
