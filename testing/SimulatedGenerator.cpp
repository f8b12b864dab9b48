#include "testing/SimulatedGenerator.h"

#include <numeric>

#include "testing/require.h"

namespace {

void perform(std::int32_t code) { require(code == 0, ktSim_DescribeCode(code)); }

}  // namespace

ktSim_Traits defaultTraits() {
  ktSim_Traits traits;
  ktSim_DefaultTraits(&traits);
  return traits;
}

ktSim_Traits smallTraits() {
  ktSim_Traits traits = defaultTraits();
  traits.memoryWordBytes = 8;
  traits.memorySizeBytes = 4096;
  traits.minFetchSamples = 8;
  traits.sequenceWords = 64;
  return traits;
}

SimulatedGenerator::SimulatedGenerator(const ktSim_Traits& given) : traits_(given) {
  perform(ktSim_CreateFpga(&fpga));
  number = add(given);
}

// Ends the program where it fails.
SimulatedGenerator::~SimulatedGenerator() { perform(ktSim_DestroyFpga(fpga.fpgaSession)); }

std::uint32_t SimulatedGenerator::add(const ktSim_Traits& given) {
  std::uint32_t added = 0;
  perform(ktSim_AddGenerator(fpga.fpgaSession, &given, &added));
  return added;
}

void SimulatedGenerator::failCall(const char* function, std::int32_t code, std::uint64_t nth) {
  perform(ktSim_FailCall(fpga.fpgaSession, function, nth, code, nullptr));
}

void SimulatedGenerator::recordCalls(std::uint64_t capacity) { perform(ktSim_RecordCalls(fpga.fpgaSession, capacity)); }

std::string SimulatedGenerator::takeCalls() const {
  std::uint64_t length = 0;
  perform(ktSim_ReadCalls(fpga.fpgaSession, nullptr, 0, &length));
  std::string text(length + 1, '\0');
  perform(ktSim_ReadCalls(fpga.fpgaSession, text.data(), text.size(), &length));
  text.resize(length);
  return text;
}

void SimulatedGenerator::overrideRegister(std::uint32_t registerNumber, std::uint64_t value) {
  perform(ktSim_OverrideRegister(number, registerNumber, value));
}

std::vector<std::uint8_t> SimulatedGenerator::sampleMemory(std::uint64_t address, std::uint64_t count) const {
  std::vector<std::uint8_t> bytes(count);
  perform(ktSim_ReadSampleMemory(number, address, bytes.data(), count));
  return bytes;
}

void SimulatedGenerator::fillWithRamp() {
  std::vector<std::uint16_t> samples(traits_.memorySizeBytes / 2);
  std::iota(samples.begin(), samples.end(), std::uint16_t{1});
  perform(ktSim_WriteSampleMemory(number, 0, samples.data(), traits_.memorySizeBytes));
}

void SimulatedGenerator::program(const std::vector<ktorba::SequenceInstructionWords>& instructions) {
  if (instructions.empty()) return;
  perform(ktSim_WriteSequenceMemory(number, 0, instructions.front().words.data(), instructions.size()));
}

std::vector<std::int16_t> SimulatedGenerator::play(std::uint64_t count) {
  require(traits_.sampleWidthBits == 16, "samples of 16 bits");
  std::vector<std::int16_t> samples(count);
  samples.resize(playInto(count, samples.data(), nullptr));
  return samples;
}

std::uint64_t SimulatedGenerator::playInto(std::uint64_t count, void* samples, std::uint8_t* markers) {
  std::uint64_t played = 0;
  perform(ktSim_AdvanceInto(number, count, samples, markers, &played));
  return played;
}

ktSim_State SimulatedGenerator::state() const {
  ktSim_State state{};
  perform(ktSim_GetState(number, &state));
  return state;
}

ktSim_Counters SimulatedGenerator::counters() const {
  ktSim_Counters counters{};
  perform(ktSim_GetCounters(number, &counters));
  return counters;
}

std::vector<ktSim_DeviceFault> SimulatedGenerator::deviceFaults() const {
  std::vector<ktSim_DeviceFault> faults;
  for (ktSim_DeviceFault fault; ktSim_GetDeviceFault(number, faults.size(), &fault) == 0;) faults.push_back(fault);
  return faults;
}
