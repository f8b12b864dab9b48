// A simulated FPGA with a FIFO that gives back what is written, and a register, both named "a b".
#pragma once

#include <gtest/gtest.h>

#include "ktorba/simulator.h"
#include "platform/KtFpga.h"

struct SimulatedFpga {
  SimulatedFpga() {
    ktSim_Fpga fpga;
    EXPECT_EQ(ktSim_CreateFpga(&fpga), 0);
    session = fpga.fpgaSession;
    EXPECT_EQ(ktSim_AddLoopbackFifo(session, "a b", &fifo), 0);
    EXPECT_EQ(ktSim_AddRegisterName(session, "a b", 35), 0);
    // Called by its name, so that the library is loaded already, as by a host.
    EXPECT_EQ(KtFpgaDll_StopFifo(session, fifo), 0);
  }
  ~SimulatedFpga() { ktSim_DestroyFpga(session); }
  SimulatedFpga(const SimulatedFpga&) = delete;

  void failNext(const char* function, std::int32_t code) { ktSim_FailCall(session, function, 1, code, nullptr); }

  std::uint64_t calls() {
    std::uint64_t count = 0;
    ktSim_GetCallCount(session, &count);
    return count;
  }

  std::uint32_t session = 0;
  std::uint32_t fifo = 0;
};
