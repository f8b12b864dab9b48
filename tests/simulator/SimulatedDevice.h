// A simulated generator driven as a host drives one, through the platform functions, with verbs for the tests.
#pragma once

#include <gmock/gmock.h>

#include <cstdint>
#include <functional>
#include <initializer_list>
#include <string>
#include <utility>
#include <vector>

#include "ktorba/hwRecords/registers.h"
#include "ktorba/ktorba.h"
#include "ktorba/script/instructionFormat.h"
#include "ktorba/simulator.h"

namespace simulator_test {

using ktorba::Command;
using ktorba::Opcode;
using ktorba::Register;
using ktorba::SequenceInstructionWords;
using Bytes = std::vector<std::uint8_t>;

// An instruction from hand-picked fields, all others 0.
using FieldValue = std::pair<ktorba::InstructionField, std::uint32_t>;
SequenceInstructionWords instruction(Opcode opcode, std::initializer_list<FieldValue> fields);

// The framework's answer: code and elaboration.
struct Answer {
  std::int32_t code;
  std::string json;
};
Answer ask(const std::function<void(tStatus*)>& call);

struct Played {
  std::vector<int> samples;
  std::vector<int> markers;
};

class SimulatedDevice : public testing::Test {
 public:
  SimulatedDevice() { EXPECT_EQ(ktSim_CreateFpga(&fpga), 0); }
  ~SimulatedDevice() override { EXPECT_EQ(ktSim_DestroyFpga(fpga.fpgaSession), 0); }

 protected:
  static ktSim_Traits defaultTraits();
  // Small enough to think about: 16-bit samples, 4 per word of 8 bytes, 1024 bytes, 32 instructions, elements of bytes.
  static ktSim_Traits smallTraits();
  // Adds the generator that the verbs below mean, its FIFO started.
  void add(const ktSim_Traits& traits = smallTraits());

  Answer write(Register number, std::uint64_t value);
  std::uint64_t read(Register number);
  void command(Command code) { EXPECT_EQ(write(Register::kCommand, static_cast<std::uint64_t>(code)).code, 0); }

  struct Announcement {
    std::uint64_t masked, address, elements, firstMask = 65535, lastMask = 65535;
  };
  void announce(const Announcement& announcement);
  std::int32_t send(const Bytes& bytes, std::uint32_t timeoutMs = 0, std::uint64_t* room = nullptr);
  Bytes sampleMemory(std::uint64_t address, std::uint64_t count);

  // Puts samples 1, 2, 3, ... into the whole sample memory.
  void fillWithRamp();
  void program(const std::vector<SequenceInstructionWords>& words);
  // Plays up to `count` samples and gives them.
  Played play(std::uint64_t count);
  std::vector<std::uint32_t> traceAddresses();

  ktSim_State state();
  ktSim_Counters counters();
  std::vector<ktSim_DeviceFault> deviceFaults();
  std::string calls();

  ktSim_Fpga fpga{};
  std::uint32_t generator = 0;
  std::uint32_t fifo = 0;
  std::uint32_t context = 0;
};

// Sample values first, first + 1, ...
std::vector<int> ramp(int first, std::size_t count);

}  // namespace simulator_test
