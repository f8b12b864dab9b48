#include "SimulatedDevice.h"

#include <numeric>

#include "kterr/Status.h"
#include "platform/KtFpga.h"
#include "platform/ktifwu.h"

namespace simulator_test {

SequenceInstructionWords instruction(Opcode opcode, std::initializer_list<FieldValue> fields) {
  SequenceInstructionWords words;
  ktorba::writeField(words, ktorba::kOpcodeField, static_cast<std::uint32_t>(opcode));
  for (const ktorba::InstructionFormat& format : ktorba::kInstructionFormats) {
    if (format.opcode != opcode) continue;
    for (const ktorba::InstructionField& field : format.fields) {
      std::uint32_t value = field.bias;
      for (const auto& [chosen, chosenValue] : fields) {
        if (std::string_view(chosen.name) == field.name) value = chosenValue;
      }
      ktorba::writeField(words, field, value);
    }
  }
  return words;
}

ktSim_Traits SimulatedDevice::defaultTraits() {
  ktSim_Traits traits;
  ktSim_DefaultTraits(&traits);
  return traits;
}

ktSim_Traits SimulatedDevice::smallTraits() {
  ktSim_Traits traits = defaultTraits();
  traits.memoryWordBytes = 8;
  traits.memorySizeBytes = 1024;
  traits.minFetchSamples = 4;
  traits.sequenceWords = 32;
  traits.downloadElementBits = 8;
  return traits;
}

void SimulatedDevice::add(const ktSim_Traits& traits) {
  ASSERT_EQ(ktSim_AddGenerator(fpga.fpgaSession, &traits, &generator), 0);
  ASSERT_EQ(KtFpgaDll_FindFifoPrivate(fpga.fpgaSession, "wfm gen.download fifo 0", 0xFFFFFFFF, &fifo), 0);
  ktIFW_Context_GetChild(fpga.ifwSession, 101, 0, fpga.parentContext, &context, nullptr);
  ASSERT_EQ(KtFpgaDll_StartFifo(fpga.fpgaSession, fifo), 0);
}

Answer ask(const std::function<void(tStatus*)>& call) {
  tStatus status = kterr::makeStatus();
  call(&status);
  Answer answer{status.code, status.json == nullptr ? "" : status.json};
  kterr::freeJson(status);
  return answer;
}

Answer SimulatedDevice::write(Register number, std::uint64_t value) {
  return ask([&](tStatus* status) {
    std::uint8_t subsystem = 0;
    std::uint64_t offset = 0;
    ktIFW_Context_Contextualize(fpga.ifwSession, context, static_cast<std::uint64_t>(number), &subsystem, &offset,
                                status);
    ktIFW_Target_Write(fpga.ifwTarget, subsystem, offset, value, true, 1000, status);
  });
}

std::uint64_t SimulatedDevice::read(Register number) {
  std::uint64_t value = 0;
  const Answer answer = ask([&](tStatus* status) {
    std::uint8_t subsystem = 0;
    std::uint64_t offset = 0;
    ktIFW_Context_Contextualize(fpga.ifwSession, context, static_cast<std::uint64_t>(number), &subsystem, &offset,
                                status);
    ktIFW_Target_Read(fpga.ifwTarget, subsystem, offset, &value, 1000, status);
  });
  EXPECT_EQ(answer.code, 0) << "register " << static_cast<int>(number);
  return value;
}

void SimulatedDevice::announce(const Announcement& announcement) {
  write(Register::kWriteAddress, announcement.address);
  write(Register::kWriteElements, announcement.elements);
  write(Register::kWriteFirstWordMask, announcement.firstMask);
  write(Register::kWriteLastWordMask, announcement.lastMask);
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

Played SimulatedDevice::play(std::uint64_t count) {
  std::vector<std::int16_t> samples(count);
  Bytes markers(count, 0xEE);  // clearing them is the device's part
  std::uint64_t played = 0;
  EXPECT_EQ(ktSim_AdvanceInto(generator, count, samples.data(), markers.data(), &played), 0);
  samples.resize(played);
  markers.resize(played);
  return {{samples.begin(), samples.end()}, {markers.begin(), markers.end()}};
}

std::vector<std::uint32_t> SimulatedDevice::traceAddresses() {
  std::vector<ktSim_TraceEntry> entries(1000);
  std::uint64_t count = 0;
  EXPECT_EQ(ktSim_ReadTrace(generator, entries.size(), entries.data(), &count), 0);
  std::vector<std::uint32_t> addresses;
  for (std::size_t i = 0; i < count; ++i) addresses.push_back(entries[i].address);
  return addresses;
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

std::string SimulatedDevice::calls() {
  std::uint64_t length = 0;
  EXPECT_EQ(ktSim_ReadCalls(fpga.fpgaSession, nullptr, 0, &length), 0);
  std::string text(length + 1, '\0');
  EXPECT_EQ(ktSim_ReadCalls(fpga.fpgaSession, text.data(), text.size(), &length), 0);
  text.resize(length);
  return text;
}

std::vector<int> ramp(int first, std::size_t count) {
  std::vector<int> values(count);
  std::iota(values.begin(), values.end(), first);
  return values;
}

}  // namespace simulator_test
