#include "testing/SimulatedDevice.h"

#include "testing/Record.h"
#include "testing/require.h"

namespace {

using ktorba::Register;

std::uint64_t busOffset(Register which, std::uint8_t nth) {
  return nth * std::uint64_t{0x10000} + static_cast<std::uint64_t>(which);
}

}  // namespace

ktorba::SequenceInstructionWords instruction(ktorba::Opcode opcode, std::initializer_list<FieldValue> fields) {
  ktorba::SequenceInstructionWords words;
  ktorba::writeField(words, ktorba::kOpcodeField, static_cast<std::uint32_t>(opcode));
  for (const auto& [field, value] : fields) ktorba::writeField(words, field, value);
  return words;
}

SimulatedDevice::SimulatedDevice(const ktSim_Traits& given) : SimulatedGenerator(given) {
  const std::int32_t code = KtFpgaDll_FindFifoPrivate(fpga.fpgaSession, "wfm gen.download fifo 0", 0xFFFFFFFF, &fifo);
  require(code == 0 && KtFpgaDll_StartFifo(fpga.fpgaSession, fifo) == 0, "the generator's FIFO");
}

ktSim_Traits SimulatedDevice::bytewiseTraits() {
  ktSim_Traits made = smallTraits();
  made.downloadElementBits = 8;
  return made;
}

std::int32_t SimulatedDevice::write(Register which, std::uint64_t value, std::uint8_t nth) {
  Record record;
  ktIFW_Target_Write(fpga.ifwTarget, nth, busOffset(which, nth), value, true, 1000, &record);
  return record.code;
}

std::int32_t SimulatedDevice::read(Register which, std::uint64_t& value, std::uint8_t nth) {
  Record record;
  ktIFW_Target_Read(fpga.ifwTarget, nth, busOffset(which, nth), &value, 1000, &record);
  return record.code;
}

std::uint64_t SimulatedDevice::read(Register which) {
  std::uint64_t value = 0;
  require(read(which, value) == 0, "a register to read");
  return value;
}

void SimulatedDevice::command(ktorba::Command code) {
  require(write(Register::kCommand, static_cast<std::uint64_t>(code)) == 0, "the command register");
}

void SimulatedDevice::announce(const Announcement& announcement) {
  write(Register::kWriteAddress, announcement.address);
  write(Register::kWriteElements, announcement.elements);
  write(Register::kWriteFirstWordMask, announcement.masked * UINT64_MAX);
  write(Register::kWriteLastWordMask, announcement.masked * UINT64_MAX);
  write(Register::kWriteMasked, announcement.masked);
  command(ktorba::Command::kStartMemoryWrite);
}

std::int32_t SimulatedDevice::send(const Bytes& bytes, std::uint32_t timeoutMs, std::uint64_t* room) {
  return KtFpgaDll_WriteFifoU8(fpga.fpgaSession, fifo, bytes.data(), bytes.size(), timeoutMs, room);
}
