#include "SimulatedHost.h"

namespace endToEnd {
namespace {

constexpr std::int32_t kTimeoutMs = 1000;

}  // namespace

SimulatedHost::SimulatedHost(const ktSim_Traits& traits) : traits_(traits) {
  EXPECT_OK(ktSim_CreateFpga(&fpga_));
  EXPECT_OK(ktSim_AddGenerator(fpga_.fpgaSession, &traits, &generator));
  EXPECT_OK(ktORBA_OpenOrbaSession(fpga_.fpgaSession, fpga_.ifwTarget, fpga_.ifwSession, &fpga_.parentContext, 0,
                                   &session, nullptr));
}

SimulatedHost::~SimulatedHost() {
  EXPECT_OK(ktORBA_CloseOrbaSession(session, nullptr));
  EXPECT_OK(ktSim_DestroyFpga(fpga_.fpgaSession));
}

std::int32_t SimulatedHost::write(const std::string& name, const Samples& samples, std::size_t first,
                                  std::size_t count) {
  const auto numSamples = static_cast<std::uint32_t>(count);
  if (traits_.sampleWidthBits == 32) {
    return ktORBA_WriteWaveformU32(session, name.c_str(), samples.data() + first, numSamples, kTimeoutMs, nullptr);
  }
  const std::vector<std::int16_t> narrow(samples.begin() + static_cast<std::ptrdiff_t>(first),
                                         samples.begin() + static_cast<std::ptrdiff_t>(first + count));
  return ktORBA_WriteWaveformI16(session, name.c_str(), narrow.data(), numSamples, kTimeoutMs, nullptr);
}

Played SimulatedHost::advance(std::uint64_t count) {
  Played played;
  played.samples.resize(count);
  played.markers.resize(count);
  std::uint64_t done = 0;
  if (traits_.sampleWidthBits == 32) {
    EXPECT_OK(ktSim_AdvanceInto(generator, count, played.samples.data(), played.markers.data(), &done));
  } else {
    std::vector<std::uint16_t> narrow(count);
    EXPECT_OK(ktSim_AdvanceInto(generator, count, narrow.data(), played.markers.data(), &done));
    played.samples.assign(narrow.begin(), narrow.end());
  }
  played.samples.resize(done);
  played.markers.resize(done);
  return played;
}

}  // namespace endToEnd
