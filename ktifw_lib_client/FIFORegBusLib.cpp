#include "ktifw_lib_client/FIFORegBusLib.h"

#include <boost/container/small_vector.hpp>
#include <new>

#include "ktifw_lib_client/FrameworkStatus.h"
#include "platform/fpga/KtifwuLibrary.h"

namespace ktifw_lib_client {

using ktifw::ReadInstruction;
using ktifw::WriteInstruction;
using platform::Ktifwu;

namespace {

// Transfers of up to this many registers take no memory from the heap; the longest list of settings has 11.
constexpr std::size_t kInlineRegisters = 16;

template <typename Field>
using Column = boost::container::small_vector<Field, kInlineRegisters>;

// One field of every instruction, in their order.
template <typename Instruction, typename Field>
Column<Field> column(const Instruction* instructions, std::uint32_t count, Field Instruction::*field) {
  Column<Field> fields;
  fields.reserve(count);
  for (std::uint32_t i = 0; i < count; ++i) fields.push_back(instructions[i].*field);
  return fields;
}

// Runs `split`, which makes columns, and reports when there is no memory for them. What else a transfer may throw comes
// from the platform and is not told from here.
template <typename Split>
bool makeColumns(Status& status, const Split& split) {
  try {
    split();
    return true;
  } catch (const std::bad_alloc&) {
    setOutOfMemory(status);
    return false;
  }
}

}  // namespace

void FIFORegBusLib::read(const ReadInstruction& instruction, std::uint64_t& value, std::uint32_t timeoutMs,
                         Status& status) {
  if (failed(status)) return;
  callFramework(status, 0, [&](tStatus* framework) {
    Ktifwu().Target_Read(target_, instruction.subsystem, instruction.offset, &value, timeoutMs, framework);
  });
}

void FIFORegBusLib::readArray(const ReadInstruction* instructions, std::uint32_t count, std::uint64_t* values,
                              std::uint32_t timeoutMs, Status& status) {
  if (failed(status)) return;
  Column<std::uint8_t> subsystems;
  Column<std::uint64_t> offsets;
  const auto split = [&] {
    subsystems = column(instructions, count, &ReadInstruction::subsystem);
    offsets = column(instructions, count, &ReadInstruction::offset);
  };
  if (!makeColumns(status, split)) return;
  callFramework(status, 0, [&](tStatus* framework) {
    Ktifwu().Target_ReadArray(target_, subsystems.data(), offsets.data(), count, values, timeoutMs, framework);
  });
}

void FIFORegBusLib::write(const WriteInstruction& instruction, bool flag, std::uint32_t timeoutMs, Status& status) {
  if (failed(status)) return;
  callFramework(status, 0, [&](tStatus* framework) {
    Ktifwu().Target_Write(target_, instruction.subsystem, instruction.offset, instruction.value, flag, timeoutMs,
                          framework);
  });
}

void FIFORegBusLib::writeArray(const WriteInstruction* instructions, std::uint32_t count, bool flag,
                               std::uint32_t timeoutMs, Status& status) {
  if (failed(status)) return;
  Column<std::uint8_t> subsystems;
  Column<std::uint64_t> offsets;
  Column<std::uint64_t> values;
  const auto split = [&] {
    subsystems = column(instructions, count, &WriteInstruction::subsystem);
    offsets = column(instructions, count, &WriteInstruction::offset);
    values = column(instructions, count, &WriteInstruction::value);
  };
  if (!makeColumns(status, split)) return;
  callFramework(status, 0, [&](tStatus* framework) {
    Ktifwu().Target_WriteArray(target_, subsystems.data(), offsets.data(), values.data(), count, flag, timeoutMs,
                               framework);
  });
}

void FIFORegBusLib::reset(Status& status) {
  if (failed(status)) return;
  callFramework(status, 0, [&](tStatus* framework) { Ktifwu().Target_Reset(target_, framework); });
}

}  // namespace ktifw_lib_client
