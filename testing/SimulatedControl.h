// The command layer on a simulated generator, with what it stands on.
#pragma once

#include "ktifw_lib_client/FIFORegBusLib.h"
#include "ktifw_lib_client/SubsystemMapLib.h"
#include "ktorba/commandControl/CommandControl.h"
#include "testing/SimulatedGenerator.h"

namespace ktorba {

template <typename Control = CommandControl>
struct SimulatedControl {
  explicit SimulatedControl(const ktSim_Traits& traits = smallTraits()) : generator(traits) {}

  SimulatedGenerator generator;
  kterr::tLocatedStatus status = kterr::makeLocatedStatus();
  ktifw_lib_client::SubsystemMapLib map{generator.fpga.ifwSession};
  ktifw_lib_client::FIFORegBusLib bus{generator.fpga.ifwTarget};
  Control control{*map.getContext(2, status), bus, status};
};

}  // namespace ktorba
