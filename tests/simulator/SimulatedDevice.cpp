#include "SimulatedDevice.h"

#include <numeric>

#include "kterr/Status.h"
#include "platform/KtFpga.h"
#include "platform/ktifwu.h"

namespace simulator_test {
namespace {

std::uint64_t busOffset(Register number, std::uint8_t nth) {
  return nth * std::uint64_t{0x10000} + static_cast<std::uint64_t>(number);
}

}  // namespace

SequenceInstructionWords instruction(Opcode opcode, std::initializer_list<FieldValue> fields) {
  SequenceInstructionWords words;
  ktorba::writeField(words, ktorba::kOpcodeField, static_cast<std::uint32_t>(opcode));
  for (const auto& [field, value] : fields) ktorba::writeField(words, field, value);
  return words;
}

ktSim_Traits SimulatedDevice::smallTraits() {
  ktSim_Traits traits;
  ktSim_DefaultTraits(&traits);
  traits.memoryWordBytes = 8;
  traits.memorySizeBytes = 1024;
  traits.minFetchSamples = 4;
  traits.sequenceWords = 32;
  traits.downloadElementBits = 8;
  return traits;
}

void SimulatedDevice::add(const ktSim_Traits& traits) {
  if (generator != 0) {
    ASSERT_EQ(ktSim_DestroyFpga(fpga.fpgaSession), 0);
    ASSERT_EQ(ktSim_CreateFpga(&fpga), 0);
  }
  ASSERT_EQ(ktSim_AddGenerator(fpga.fpgaSession, &traits, &generator), 0);
  ASSERT_EQ(KtFpgaDll_FindFifoPrivate(fpga.fpgaSession, "wfm gen.download fifo 0", 0xFFFFFFFF, &fifo), 0);
  ASSERT_EQ(KtFpgaDll_StartFifo(fpga.fpgaSession, fifo), 0);
}

std::int32_t SimulatedDevice::write(Register number, std::uint64_t value, std::uint8_t nth) {
  tStatus status = kterr::makeStatus();
  ktIFW_Target_Write(fpga.ifwTarget, nth, busOffset(number, nth), value, true, 1000, &status);
  kterr::freeJson(status);
  return status.code;
}

std::int32_t SimulatedDevice::read(Register number, std::uint64_t& value, std::uint8_t nth) {
  tStatus status = kterr::makeStatus();
  ktIFW_Target_Read(fpga.ifwTarget, nth, busOffset(number, nth), &value, 1000, &status);
  kterr::freeJson(status);
  return status.code;
}

std::uint64_t SimulatedDevice::read(Register number) {
  std::uint64_t value = 0;
  EXPECT_EQ(read(number, value), 0) << "register " << static_cast<int>(number);
  return value;
}

void SimulatedDevice::announce(const Announcement& announcement) {
  write(Register::kWriteAddress, announcement.address);
  write(Register::kWriteElements, announcement.elements);
  write(Register::kWriteFirstWordMask, announcement.masked * UINT64_MAX);
  write(Register::kWriteLastWordMask, announcement.masked * UINT64_MAX);
  write(Register::kWriteMasked, announcement.masked);
  command(Command::kStartMemoryWrite);
}

std::int32_t SimulatedDevice::send(const Bytes& bytes, std::uint32_t timeoutMs, std::uint64_t* room) {
  return KtFpgaDll_WriteFifoU8(fpga.fpgaSession, fifo, bytes.data(), bytes.size(), timeoutMs, room);
}

Bytes SimulatedDevice::sampleMemory(std::uint64_t address, std::uint64_t count) {
  Bytes bytes(count);
  EXPECT_EQ(ktSim_ReadSampleMemory(generator, address, bytes.data(), count), 0);
  return bytes;
}

void SimulatedDevice::fillWithRamp() {
  std::vector<std::int16_t> samples(read(Register::kMemorySizeBytes) / 2);
  std::iota(samples.begin(), samples.end(), std::int16_t{1});
  ASSERT_EQ(ktSim_WriteSampleMemory(generator, 0, samples.data(), samples.size() * 2), 0);
}

void SimulatedDevice::program(const std::vector<SequenceInstructionWords>& words) {
  ASSERT_EQ(ktSim_WriteSequenceMemory(generator, 0, words.front().words.data(), words.size()), 0);
}

std::vector<int> SimulatedDevice::play(std::uint64_t count) {
  std::vector<std::int16_t> samples(count);
  std::uint64_t played = 0;
  EXPECT_EQ(ktSim_AdvanceInto(generator, count, samples.data(), nullptr, &played), 0);
  samples.resize(played);
  return {samples.begin(), samples.end()};
}

ktSim_State SimulatedDevice::state() {
  ktSim_State state{};
  EXPECT_EQ(ktSim_GetState(generator, &state), 0);
  return state;
}

ktSim_Counters SimulatedDevice::counters() {
  ktSim_Counters counters{};
  EXPECT_EQ(ktSim_GetCounters(generator, &counters), 0);
  return counters;
}

std::vector<ktSim_DeviceFault> SimulatedDevice::deviceFaults() {
  std::vector<ktSim_DeviceFault> faults;
  for (ktSim_DeviceFault fault; ktSim_GetDeviceFault(generator, faults.size(), &fault) == 0;) faults.push_back(fault);
  return faults;
}

}  // namespace simulator_test
