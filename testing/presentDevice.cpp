// Makes of the simulator's FPGA interface library that of a device that is there before any host is, as hardware is:
// the first FPGA of the process, with one generator, which plays while it is polled.
#include <cstdint>
#include <cstdlib>

#include "ktorba/simulator.h"

namespace {

[[maybe_unused]] const bool isThere = [] {
  ktSim_Fpga fpga;
  ktSim_Traits traits;
  std::uint32_t generator = 0;
  ktSim_DefaultTraits(&traits);
  traits.sampleWidthBits = 32;
  if (ktSim_CreateFpga(&fpga) != 0 || ktSim_AddGenerator(fpga.fpgaSession, &traits, &generator) != 0) std::abort();
  return ktSim_SetAutoAdvance(generator, 1000) == 0;
}();

}  // namespace
