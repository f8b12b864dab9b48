// The command layer as the state machine sees it: every command operation passes through unchanged, and the
// transitions that the hardware takes part in write one command each and raise its failure.
#pragma once

#include "ktorba/commandControl/CommandControlInterface.h"
#include "ktorba/hwRecords/Interfaces.h"

namespace ktorba {

class TransitionableCommandControl : public CommandControlInterface, public TransitionableInterface {
 public:
  // Borrows `target` for the life of this object.
  explicit TransitionableCommandControl(CommandControlInterface& target) : target_(target) {}

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

  void configure(bool force) override;
  void prepare() override {}
  void initiate() override;
  void reset() override;
  void abort() override;

 private:
  CommandControlInterface& target_;
};

}  // namespace ktorba
