// The generator of GeneratorOptions as a simulated one.
#pragma once

#include "ktorba/simulator.h"
#include "tools/program/GeneratorOptions.h"

namespace tools {

// Throws Refusal, with setting and bounds, when no simulated generator can have such traits.
void checkOptions(const GeneratorOptions& options);

ktSim_Traits toSimulatorTraits(const GeneratorOptions& options);

}  // namespace tools
