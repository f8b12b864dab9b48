// A simulated generator driven as a host drives one, through the platform functions, with verbs for the tests.
#pragma once

#include <gmock/gmock.h>

#include <cstdint>
#include <initializer_list>
#include <numeric>
#include <utility>
#include <vector>

#include "kterr/Status.h"
#include "ktorba/hwRecords/registers.h"
#include "ktorba/ktorba.h"
#include "ktorba/script/instructionFormat.h"
#include "ktorba/simulator.h"
#include "platform/fpga/KtFpga.h"
#include "platform/fpga/ktifwu.h"

namespace simulator_test {

using ktorba::Command;
using ktorba::Opcode;
using ktorba::Register;
using ktorba::SequenceInstructionWords;
using Bytes = std::vector<std::uint8_t>;

// An instruction from hand-picked fields, all others 0.
using FieldValue = std::pair<ktorba::InstructionField, std::uint32_t>;
inline SequenceInstructionWords instruction(Opcode opcode, std::initializer_list<FieldValue> fields) {
  SequenceInstructionWords words;
  ktorba::writeField(words, ktorba::kOpcodeField, static_cast<std::uint32_t>(opcode));
  for (const auto& [field, value] : fields) ktorba::writeField(words, field, value);
  return words;
}

class SimulatedDevice : public testing::Test {
 public:
  ~SimulatedDevice() override { EXPECT_EQ(ktSim_DestroyFpga(fpga.fpgaSession), 0); }

 protected:
  SimulatedDevice() {
    EXPECT_EQ(ktSim_CreateFpga(&fpga), 0);
    add(smallTraits());
  }

  // Small enough to think about: 16-bit samples, 4 per word of 8 bytes, 1024 bytes, 32 instructions, elements of bytes.
  static ktSim_Traits smallTraits() {
    ktSim_Traits traits;
    ktSim_DefaultTraits(&traits);
    traits.memoryWordBytes = 8;
    traits.memorySizeBytes = 1024;
    traits.minFetchSamples = 4;
    traits.sequenceWords = 32;
    traits.downloadElementBits = 8;
    return traits;
  }

  // Another generator for the verbs below, on an FPGA of its own.
  void replace(const ktSim_Traits& traits) {
    EXPECT_EQ(ktSim_DestroyFpga(fpga.fpgaSession), 0);
    EXPECT_EQ(ktSim_CreateFpga(&fpga), 0);
    add(traits);
  }

  // Registers of the FPGA's first generator, or of the one behind it; each gives the framework's code.
  std::int32_t write(Register number, std::uint64_t value, std::uint8_t nth = 1) {
    tStatus status = kterr::makeStatus();
    ktIFW_Target_Write(fpga.ifwTarget, nth, busOffset(number, nth), value, true, 1000, &status);
    kterr::freeJson(status);
    return status.code;
  }
  std::int32_t read(Register number, std::uint64_t& value, std::uint8_t nth = 1) {
    tStatus status = kterr::makeStatus();
    ktIFW_Target_Read(fpga.ifwTarget, nth, busOffset(number, nth), &value, 1000, &status);
    kterr::freeJson(status);
    return status.code;
  }
  std::uint64_t read(Register number) {
    std::uint64_t value = 0;
    EXPECT_EQ(read(number, value), 0) << "register " << static_cast<int>(number);
    return value;
  }
  void command(Command code) { EXPECT_EQ(write(Register::kCommand, static_cast<std::uint64_t>(code)), 0); }

  struct Announcement {
    std::uint64_t masked, address, elements;
  };
  // All bytes enabled by the masks when they count, none when they do not.
  void announce(const Announcement& announcement) {
    write(Register::kWriteAddress, announcement.address);
    write(Register::kWriteElements, announcement.elements);
    write(Register::kWriteFirstWordMask, announcement.masked * UINT64_MAX);
    write(Register::kWriteLastWordMask, announcement.masked * UINT64_MAX);
    write(Register::kWriteMasked, announcement.masked);
    command(Command::kStartMemoryWrite);
  }
  std::int32_t send(const Bytes& bytes, std::uint32_t timeoutMs = 0, std::uint64_t* room = nullptr) {
    return KtFpgaDll_WriteFifoU8(fpga.fpgaSession, fifo, bytes.data(), bytes.size(), timeoutMs, room);
  }
  Bytes sampleMemory(std::uint64_t address, std::uint64_t count) {
    Bytes bytes(count);
    EXPECT_EQ(ktSim_ReadSampleMemory(generator, address, bytes.data(), count), 0);
    return bytes;
  }

  // Puts samples 1, 2, 3, ... into the whole sample memory.
  void fillWithRamp() {
    std::vector<std::int16_t> samples(read(Register::kMemorySizeBytes) / 2);
    std::iota(samples.begin(), samples.end(), std::int16_t{1});
    EXPECT_EQ(ktSim_WriteSampleMemory(generator, 0, samples.data(), samples.size() * 2), 0);
  }
  void program(const std::vector<SequenceInstructionWords>& words) {
    EXPECT_EQ(ktSim_WriteSequenceMemory(generator, 0, words.front().words.data(), words.size()), 0);
  }
  // Plays up to `count` samples and gives them.
  std::vector<int> play(std::uint64_t count) {
    std::vector<std::int16_t> samples(count);
    std::uint64_t played = 0;
    EXPECT_EQ(ktSim_AdvanceInto(generator, count, samples.data(), nullptr, &played), 0);
    samples.resize(played);
    return {samples.begin(), samples.end()};
  }

  ktSim_State state() {
    ktSim_State state{};
    EXPECT_EQ(ktSim_GetState(generator, &state), 0);
    return state;
  }
  ktSim_Counters counters() {
    ktSim_Counters counters{};
    EXPECT_EQ(ktSim_GetCounters(generator, &counters), 0);
    return counters;
  }
  std::vector<ktSim_DeviceFault> deviceFaults() {
    std::vector<ktSim_DeviceFault> faults;
    for (ktSim_DeviceFault fault; ktSim_GetDeviceFault(generator, faults.size(), &fault) == 0;) faults.push_back(fault);
    return faults;
  }

  ktSim_Fpga fpga{};
  std::uint32_t generator = 0;
  std::uint32_t fifo = 0;

 private:
  void add(const ktSim_Traits& traits) {
    EXPECT_EQ(ktSim_AddGenerator(fpga.fpgaSession, &traits, &generator), 0);
    EXPECT_EQ(KtFpgaDll_FindFifoPrivate(fpga.fpgaSession, "wfm gen.download fifo 0", 0xFFFFFFFF, &fifo), 0);
    EXPECT_EQ(KtFpgaDll_StartFifo(fpga.fpgaSession, fifo), 0);
  }

  static std::uint64_t busOffset(Register number, std::uint8_t nth) {
    return nth * std::uint64_t{0x10000} + static_cast<std::uint64_t>(number);
  }
};

}  // namespace simulator_test
