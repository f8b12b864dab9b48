// A simulated FPGA with a generator on it, and verbs for what a test does with it beside the calls of a host. A verb
// that the simulator refuses throws std::logic_error with the simulator's words: then the test is wrong.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "ktorba/ktorba.h"
#include "ktorba/script/instructionFormat.h"
#include "ktorba/simulator.h"

// Those of ktSim_DefaultTraits.
ktSim_Traits defaultTraits();

// Small enough for every address to be read at a glance: 16-bit samples, 4096 bytes of sample memory in words of 8,
// fetches from 8 samples, 64 instructions. FIFO elements have 32 bits.
ktSim_Traits smallTraits();

class SimulatedGenerator {
 public:
  explicit SimulatedGenerator(const ktSim_Traits& traits = smallTraits());
  ~SimulatedGenerator();
  SimulatedGenerator(const SimulatedGenerator&) = delete;
  SimulatedGenerator& operator=(const SimulatedGenerator&) = delete;

  // Opens a session as a host does, to the generator of this instance number. Returns the code.
  std::int32_t open(std::uint32_t& session, std::uint8_t instance = 0, tStatus* status = nullptr) const {
    return ktORBA_OpenOrbaSession(fpga.fpgaSession, fpga.ifwTarget, fpga.ifwSession, &fpga.parentContext, instance,
                                  &session, status);
  }

  // Adds another generator to the FPGA and returns its number.
  std::uint32_t add(const ktSim_Traits& traits = defaultTraits());

  // Lets the n-th platform call from now on fail, or the n-th of one function.
  void failCall(const char* function, std::int32_t code, std::uint64_t nth = 1);

  // Records so many platform calls; the calls recorded since they were last taken, a line each.
  void recordCalls(std::uint64_t capacity = 1000);
  std::string takeCalls() const;

  void overrideRegister(std::uint32_t registerNumber, std::uint64_t value);

  std::vector<std::uint8_t> sampleMemory(std::uint64_t address, std::uint64_t bytes) const;
  // Puts the samples 1, 2, 3, ..., of 16 bits, into the whole sample memory.
  void fillWithRamp();
  // Puts the instructions into sequence memory, from its start on.
  void program(const std::vector<ktorba::SequenceInstructionWords>& instructions);

  // Play up to `count` samples. The first gives them, of 16 bits; the second tells how many there were: either place
  // may be null.
  std::vector<std::int16_t> play(std::uint64_t count);
  std::uint64_t playInto(std::uint64_t count, void* samples, std::uint8_t* markers);

  ktSim_State state() const;
  ktSim_Counters counters() const;
  std::vector<ktSim_DeviceFault> deviceFaults() const;

  ktSim_Fpga fpga{};
  std::uint32_t number = 0;  // of the generator

 private:
  const ktSim_Traits traits_;
};
