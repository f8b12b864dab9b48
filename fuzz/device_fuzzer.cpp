// Arbitrary instruction words in the simulated device: it comes to an end, and plays the same whether in one go or in
// pieces.
#include <fuzzer/FuzzedDataProvider.h>

#include <algorithm>
#include <numeric>
#include <stdexcept>
#include <vector>

#include "kterr/Status.h"
#include "ktorba/hwRecords/registers.h"
#include "ktorba/script/instructionFormat.h"
#include "ktorba/simulator.h"
#include "platform/fpga/ktifwu.h"

namespace {

using ktorba::SequenceInstructionWords;

constexpr std::uint32_t kInstructions = 32;
constexpr std::uint64_t kMostSamples = 512;

void require(bool holds, const char* what) {
  if (!holds) throw std::logic_error(what);
}

struct Program {
  ktSim_Traits traits;
  std::vector<std::uint32_t> words;
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
  Program program;
  ktSim_DefaultTraits(&program.traits);
  program.traits.sampleWidthBits = input.ConsumeBool() ? 16 : 32;
  program.traits.memoryWordBytes = input.ConsumeBool() ? 8 : 64;
  program.traits.memorySizeBytes = 4096;
  program.traits.sequenceWords = kInstructions;
  constexpr int kStreaming[] = {18, 19, 20, 21, 22, 23, 24};
  for (int count = input.ConsumeIntegralInRange(0, 8); count > 0; --count) {
    program.registers.emplace_back(ktorba::Register{static_cast<std::uint8_t>(input.PickValueInArray(kStreaming))},
                                   input.ConsumeIntegral<std::uint8_t>());
  }
  for (int count = input.ConsumeIntegralInRange(0, 8); count > 0; --count) {
    program.triggers.emplace_back(input.ConsumeIntegralInRange(1, 8), input.ConsumeIntegralInRange(0, 300));
  }
  while (program.words.size() < 4 * kInstructions && input.remaining_bytes() != 0) {
    for (const std::uint32_t word : readInstruction(input).words) program.words.push_back(word);
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

class Device {
 public:
  explicit Device(const Program& program) {
    ktSim_CreateFpga(&fpga_);
    require(ktSim_AddGenerator(fpga_.fpgaSession, &program.traits, &generator_) == 0, "a generator");
    std::vector<std::uint16_t> ramp(program.traits.memorySizeBytes / 2);
    std::iota(ramp.begin(), ramp.end(), std::uint16_t{1});
    ktSim_WriteSampleMemory(generator_, 0, ramp.data(), program.traits.memorySizeBytes);
    require(ktSim_WriteSequenceMemory(generator_, 0, program.words.data(), program.words.size() / 4) == 0, "a program");
    for (const auto& [trigger, sample] : program.triggers) ktSim_RaiseTriggerAt(generator_, trigger, sample);
    for (const auto& [number, value] : program.registers) write(number, value);
    write(ktorba::Register::kCommand, static_cast<std::uint64_t>(ktorba::Command::kInitiate));
  }
  ~Device() { ktSim_DestroyFpga(fpga_.fpgaSession); }
  Device(const Device&) = delete;
  Device& operator=(const Device&) = delete;

  Played play(std::uint64_t pieceSamples, std::uint32_t bytesPerSample) {
    Played played;
    played.samples.resize(kMostSamples * bytesPerSample);
    played.markers.resize(kMostSamples);
    for (std::uint64_t piece = 1; piece != 0 && played.count < kMostSamples; played.count += piece) {
      require(
          ktSim_AdvanceInto(generator_, std::min(pieceSamples, kMostSamples - played.count),
                            &played.samples[played.count * bytesPerSample], &played.markers[played.count], &piece) == 0,
          "an advance");
    }
    ktSim_GetState(generator_, &played.state);
    ktSim_GetCounters(generator_, &played.counters);
    return played;
  }

 private:
  void write(ktorba::Register number, std::uint64_t value) {
    tStatus status = kterr::makeStatus();
    std::uint32_t context = 0;
    std::uint8_t subsystem = 0;
    std::uint64_t offset = 0;
    ktIFW_Context_GetChild(fpga_.ifwSession, 101, 0, fpga_.parentContext, &context, &status);
    ktIFW_Context_Contextualize(fpga_.ifwSession, context, static_cast<std::uint64_t>(number), &subsystem, &offset,
                                &status);
    ktIFW_Target_Write(fpga_.ifwTarget, subsystem, offset, value, true, 1000, &status);
    require(status.code == 0, "a register");
    kterr::freeJson(status);
  }

  ktSim_Fpga fpga_{};
  std::uint32_t generator_ = 0;
};

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  FuzzedDataProvider input(data, size);
  const auto pieceSamples = input.ConsumeIntegralInRange<std::uint64_t>(1, 64);
  const Program program = readProgram(input);
  const std::uint32_t bytesPerSample = program.traits.sampleWidthBits / 8;
  const Played whole = Device(program).play(kMostSamples, bytesPerSample);
  require(whole.count == kMostSamples || !whole.state.running, "a device that runs plays");
  require(Device(program).play(pieceSamples, bytesPerSample) == whole, "pieces play as the whole");
  return 0;
}
