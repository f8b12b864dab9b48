#include "testing/DeviceUnderTest.h"

#include <cstdlib>
#include <sstream>
#include <string>
#include <vector>

#include "testing/require.h"

std::optional<DeviceNumbers> otherDevice() {
  const char* const text = std::getenv("KTORBA_DEVICE");
  if (text == nullptr) return {};
  std::vector<std::uint32_t> numbers;
  std::istringstream stream(text);
  for (std::string number; std::getline(stream, number, ',');) {
    numbers.push_back(static_cast<std::uint32_t>(std::stoul(number, nullptr, 0)));
  }
  require(numbers.size() == 5 && numbers[4] <= UINT8_MAX,
          "KTORBA_DEVICE: FPGA session, framework target, framework session, parent context, instance");
  return DeviceNumbers{numbers[0], numbers[1], numbers[2], numbers[3], static_cast<std::uint8_t>(numbers[4])};
}

DeviceUnderTest::DeviceUnderTest(const ktSim_Traits& traits) {
  if (!otherDevice()) simulated_.emplace(traits);
}

std::int32_t DeviceUnderTest::open(std::uint32_t& session, tStatus* status) const {
  if (simulated_) return simulated_->open(session, 0, status);
  const DeviceNumbers device = *otherDevice();
  return ktORBA_OpenOrbaSession(device.fpgaSession, device.ifwTarget, device.ifwSession, &device.parentContext,
                                device.instance, &session, status);
}

SimulatedGenerator& DeviceUnderTest::simulated() {
  require(isSimulated(), "another device has no controls");
  return *simulated_;
}
