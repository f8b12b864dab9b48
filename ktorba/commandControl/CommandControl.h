// The only code that reads and writes the generator's registers. Requests become register instructions, translated by
// the generator's framework context and sent over the register bus, one transfer per request. One thread at a time.
#pragma once

#include <span>

#include "ktifw_lib_client/Interfaces.h"
#include "ktorba/commandControl/CommandControlInterface.h"
#include "ktorba/hwRecords/registers.h"

namespace ktorba {

class CommandControl : public CommandControlInterface {
 public:
  // Checks that `context` is a generator of a compatible version and reads its traits; `status` tells of failure, and
  // nothing is sent when it holds an error already. Both objects are borrowed for the life of this one.
  CommandControl(ktifw::ContextInterface& context, ktifw::InstructionTarget& registerBus, Status& status);

  void getHWTraits(HWTraits& out, Status& status, bool refresh) override;
  void setSettings(const HWSettings& settings, Status& status) override;
  void writeSettings(Status& status, bool force) override;
  void commandInitiate(Status& status) override;
  void commandReset(Status& status) override;
  void commandAbort(Status& status) override;
  void readGenerationDone(bool& out, Status& status) override;
  void readDataUnderflow(bool& out, Status& status) override;
  void announceMemoryWrite(const MemoryWriteRequest& request, Status& status) override;
  void readMemoryWriteComplete(bool& out, Status& status) override;
  void resetStreamingWritePointer(Status& status) override;
  std::uint64_t readStreamingSpace(Status& status) override;

 private:
  struct RegisterWrite {
    Register number;
    std::uint64_t value;
  };

  void checkCompatibility(Status& status);
  void readTraits(Status& status);
  std::uint64_t readRegister(Register number, Status& status);
  void readStatusBit(std::uint64_t mask, bool& out, Status& status);
  void writeCommand(Command command, Status& status);
  // Sends `writes` in one transfer, in their order.
  void writeRegisters(std::span<const RegisterWrite> writes, Status& status);

  ktifw::ContextInterface& context_;
  ktifw::InstructionTarget& registerBus_;
  bool traitsValid_ = false;
  HWTraits traits_;
  HWSettings settings_;         // to be written next
  HWSettings writtenSettings_;  // written last; what the generator holds while settingsWritten_ is set
  bool settingsWritten_ = false;
};

}  // namespace ktorba
