// A simulated generator driven as a host drives one, through the platform functions, with verbs for the tests.
#pragma once

#include <gmock/gmock.h>

#include <cstdint>
#include <initializer_list>
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

class SimulatedDevice : public testing::Test {
 public:
  SimulatedDevice() { EXPECT_EQ(ktSim_CreateFpga(&fpga), 0); }
  ~SimulatedDevice() override { EXPECT_EQ(ktSim_DestroyFpga(fpga.fpgaSession), 0); }

 protected:
  // Small enough to think about: 16-bit samples, 4 per word of 8 bytes, 1024 bytes, 32 instructions, elements of bytes.
  static ktSim_Traits smallTraits();
  // Makes the generator that the verbs below mean, its FIFO started; on an FPGA of its own when there was one before.
  void add(const ktSim_Traits& traits = smallTraits());

  // Registers of the FPGA's first generator, or of the one behind it; each gives the framework's code.
  std::int32_t write(Register number, std::uint64_t value, std::uint8_t nth = 1);
  std::int32_t read(Register number, std::uint64_t& value, std::uint8_t nth = 1);
  std::uint64_t read(Register number);
  void command(Command code) { EXPECT_EQ(write(Register::kCommand, static_cast<std::uint64_t>(code)), 0); }

  struct Announcement {
    std::uint64_t masked, address, elements;
  };
  // All bytes enabled by the masks when they count, none when they do not.
  void announce(const Announcement& announcement);
  std::int32_t send(const Bytes& bytes, std::uint32_t timeoutMs = 0, std::uint64_t* room = nullptr);
  Bytes sampleMemory(std::uint64_t address, std::uint64_t count);

  // Puts samples 1, 2, 3, ... into the whole sample memory.
  void fillWithRamp();
  void program(const std::vector<SequenceInstructionWords>& words);
  // Plays up to `count` samples and gives them.
  std::vector<int> play(std::uint64_t count);

  ktSim_State state();
  ktSim_Counters counters();
  std::vector<ktSim_DeviceFault> deviceFaults();

  ktSim_Fpga fpga{};
  std::uint32_t generator = 0;
  std::uint32_t fifo = 0;
};

}  // namespace simulator_test
