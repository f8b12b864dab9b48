// Arbitrary instruction words in the simulated device: it comes to an end, and plays the same whether in one go or in
// pieces.
#include <fuzzer/FuzzedDataProvider.h>

#include <algorithm>
#include <vector>

#include "conventions/conventions.h"
#include "testing/SimulatedDevice.h"
#include "testing/require.h"

namespace {

using ktorba::SequenceInstructionWords;

constexpr std::uint32_t kInstructions = 32;
constexpr std::uint64_t kMostSamples = 512;

struct Program {
  ktSim_Traits traits;
  std::vector<SequenceInstructionWords> instructions;
  std::vector<std::pair<std::uint32_t, std::uint64_t>> triggers;  // hardware number, sample
  std::vector<std::pair<ktorba::Register, std::uint64_t>> registers;
};

// A known opcode with small numbers in its fields, so that most programs get further than their first word.
SequenceInstructionWords tameInstruction(FuzzedDataProvider& input) {
  const auto& format = ktorba::kInstructionFormats[input.ConsumeIntegral<std::uint8_t>() % 5];
  SequenceInstructionWords result;
  ktorba::writeField(result, ktorba::kOpcodeField, static_cast<std::uint32_t>(format.opcode));
  for (const ktorba::InstructionField& field : format.fields) {
    ktorba::writeField(result, field, input.ConsumeIntegral<std::uint8_t>() % kInstructions);
  }
  return result;
}

SequenceInstructionWords readInstruction(FuzzedDataProvider& input) {
  if (input.ConsumeIntegral<std::uint8_t>() % 8 != 0) return tameInstruction(input);
  SequenceInstructionWords result;
  for (std::uint32_t& word : result.words) word = input.ConsumeIntegral<std::uint32_t>();
  return result;
}

Program readProgram(FuzzedDataProvider& input) {
  Program program{smallTraits(), {}, {}, {}};
  program.traits.sampleWidthBits = input.ConsumeBool() ? 16 : 32;
  program.traits.memoryWordBytes = input.ConsumeBool() ? 8 : 64;
  program.traits.sequenceWords = kInstructions;
  constexpr int kStreaming[] = {18, 19, 20, 21, 22, 23, 24};
  for (int count = input.ConsumeIntegralInRange(0, 8); count > 0; --count) {
    program.registers.emplace_back(ktorba::Register{static_cast<std::uint8_t>(input.PickValueInArray(kStreaming))},
                                   input.ConsumeIntegral<std::uint8_t>());
  }
  for (int count = input.ConsumeIntegralInRange(0, 8); count > 0; --count) {
    program.triggers.emplace_back(input.ConsumeIntegralInRange<std::uint32_t>(1, ktorba::kHardwareTriggerCount),
                                  input.ConsumeIntegralInRange(0, 300));
  }
  while (program.instructions.size() < kInstructions && input.remaining_bytes() != 0) {
    program.instructions.push_back(readInstruction(input));
  }
  return program;
}

// What one device played.
struct Played {
  std::vector<std::uint8_t> samples;
  std::vector<std::uint8_t> markers;
  std::uint64_t count = 0;
  ktSim_State state{};
  ktSim_Counters counters{};

  bool operator==(const Played& other) const {
    return samples == other.samples && markers == other.markers && count == other.count &&
           state.running == other.state.running && state.done == other.state.done &&
           state.underflow == other.state.underflow && state.triggerLatches == other.state.triggerLatches &&
           state.address == other.state.address && state.loopDepth == other.state.loopDepth &&
           state.lastSample == other.state.lastSample && counters.markersFired == other.counters.markersFired &&
           counters.instructionsExecuted == other.counters.instructionsExecuted &&
           counters.deviceFaults == other.counters.deviceFaults;
  }
};

Played play(const Program& program, std::uint64_t pieceSamples) {
  SimulatedDevice device(program.traits);
  device.fillWithRamp();
  device.program(program.instructions);
  for (const auto& [trigger, sample] : program.triggers) ktSim_RaiseTriggerAt(device.number, trigger, sample);
  for (const auto& [which, value] : program.registers) require(device.write(which, value) == 0, "a register");
  device.command(ktorba::Command::kInitiate);
  const std::uint32_t bytesPerSample = program.traits.sampleWidthBits / 8;
  Played played;
  played.samples.resize(kMostSamples * bytesPerSample);
  played.markers.resize(kMostSamples);
  for (std::uint64_t piece = 1; piece != 0 && played.count < kMostSamples; played.count += piece) {
    piece = device.playInto(std::min(pieceSamples, kMostSamples - played.count),
                            &played.samples[played.count * bytesPerSample], &played.markers[played.count]);
  }
  played.state = device.state();
  played.counters = device.counters();
  return played;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  FuzzedDataProvider input(data, size);
  const auto pieceSamples = input.ConsumeIntegralInRange<std::uint64_t>(1, 64);
  const Program program = readProgram(input);
  const Played whole = play(program, kMostSamples);
  require(whole.count == kMostSamples || !whole.state.running, "a device that runs plays");
  require(play(program, pieceSamples) == whole, "pieces play as the whole");
  return 0;
}
