// The generator that a suite of whole sessions plays on: a simulated one of its own, or, where KTORBA_DEVICE names one,
// another device's, whose platform libraries the loader has found first (CONTRIBUTING.md).
#pragma once

#include <cstdint>
#include <optional>

#include "testing/SimulatedGenerator.h"

// What a host opens its session with.
struct DeviceNumbers {
  std::uint32_t fpgaSession, ifwTarget, ifwSession, parentContext;
  std::uint8_t instance;
};

// Those of KTORBA_DEVICE, none when it is not there. Throws std::logic_error when it does not give all of them.
std::optional<DeviceNumbers> otherDevice();

class DeviceUnderTest {
 public:
  // The traits are the simulated generator's; another device has its own.
  explicit DeviceUnderTest(const ktSim_Traits& traits = smallTraits());

  // Opens a session and returns the code.
  std::int32_t open(std::uint32_t& session, tStatus* status = nullptr) const;

  bool isSimulated() const { return simulated_.has_value(); }

  // Its controls. Throws std::logic_error on another device: a test that needs them is skipped there.
  SimulatedGenerator& simulated();

 private:
  std::optional<SimulatedGenerator> simulated_;
};
