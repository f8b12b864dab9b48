// A simulated generator driven as a host drives one, through the platform's functions, with its FIFO started.
#pragma once

#include <cstdint>
#include <initializer_list>
#include <utility>
#include <vector>

#include "ktorba/hwRecords/registers.h"
#include "platform/fpga/KtFpga.h"
#include "platform/fpga/ktifwu.h"
#include "testing/SimulatedGenerator.h"

using Bytes = std::vector<std::uint8_t>;

// An instruction from hand-picked fields, all others 0.
using FieldValue = std::pair<ktorba::InstructionField, std::uint32_t>;
ktorba::SequenceInstructionWords instruction(ktorba::Opcode opcode, std::initializer_list<FieldValue> fields = {});

class SimulatedDevice : public SimulatedGenerator {
 public:
  // Not told otherwise, FIFO elements are bytes.
  explicit SimulatedDevice(const ktSim_Traits& traits = bytewiseTraits());

  static ktSim_Traits bytewiseTraits();

  // Registers of the FPGA's first generator, or of the one behind it; each gives the framework's code.
  std::int32_t write(ktorba::Register which, std::uint64_t value, std::uint8_t nth = 1);
  std::int32_t read(ktorba::Register which, std::uint64_t& value, std::uint8_t nth = 1);
  // Throws where the framework refuses.
  std::uint64_t read(ktorba::Register which);
  void command(ktorba::Command code);

  struct Announcement {
    std::uint64_t masked, address, elements;
  };
  // All bytes enabled by the masks when they count, none when they do not.
  void announce(const Announcement& announcement);
  // Writes into the FIFO and returns the code.
  std::int32_t send(const Bytes& bytes, std::uint32_t timeoutMs = 0, std::uint64_t* room = nullptr);

  std::uint32_t fifo = 0;
};
