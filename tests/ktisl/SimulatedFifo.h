// A simulated FPGA with a FIFO that gives back what is written, and a register, both named "a b".
#pragma once

#include <gtest/gtest.h>

#include "testing/SimulatedGenerator.h"

struct SimulatedFifo : SimulatedGenerator {
  SimulatedFifo() {
    EXPECT_EQ(ktSim_AddLoopbackFifo(session, "a b", &fifo), 0);
    EXPECT_EQ(ktSim_AddRegisterName(session, "a b", 35), 0);
  }

  const std::uint32_t session = fpga.fpgaSession;
  std::uint32_t fifo = 0;
};
