// One simulated generator and the platform's numbers for it, for tests that open sessions through ktorba.h.
#pragma once

#include <gtest/gtest.h>

#include <cstdint>
#include <string>

#include "ktorba/ktorba.h"
#include "ktorba/simulator.h"

class SimulatedGenerator {
 public:
  explicit SimulatedGenerator(const ktSim_Traits& traits) {
    EXPECT_EQ(ktSim_CreateFpga(&fpga), 0);
    EXPECT_EQ(ktSim_AddGenerator(fpga.fpgaSession, &traits, &number), 0);
  }
  ~SimulatedGenerator() { EXPECT_EQ(ktSim_DestroyFpga(fpga.fpgaSession), 0); }
  SimulatedGenerator(const SimulatedGenerator&) = delete;
  SimulatedGenerator& operator=(const SimulatedGenerator&) = delete;

  std::int32_t open(std::uint32_t& session) const {
    return ktORBA_OpenOrbaSession(fpga.fpgaSession, fpga.ifwTarget, fpga.ifwSession, &fpga.parentContext, 0, &session,
                                  nullptr);
  }

  // The platform calls recorded since the last time, a line each.
  std::string takeCalls() const {
    std::uint64_t length = 0;
    EXPECT_EQ(ktSim_ReadCalls(fpga.fpgaSession, nullptr, 0, &length), 0);
    std::string text(length + 1, '\0');
    EXPECT_EQ(ktSim_ReadCalls(fpga.fpgaSession, text.data(), text.size(), &length), 0);
    text.resize(length);
    return text;
  }

  // Small enough for every address to be read at a glance: 16-bit samples, memory words of 8 bytes.
  static ktSim_Traits smallTraits() {
    ktSim_Traits traits;
    ktSim_DefaultTraits(&traits);
    traits.memoryWordBytes = 8;
    traits.memorySizeBytes = 4096;
    traits.minFetchSamples = 8;
    traits.sequenceWords = 64;
    return traits;
  }

  ktSim_Fpga fpga{};
  std::uint32_t number = 0;
};
