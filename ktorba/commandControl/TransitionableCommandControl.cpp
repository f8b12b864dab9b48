#include "ktorba/commandControl/TransitionableCommandControl.h"

#include "ktorba/commandControl/raisingLocated.h"

namespace ktorba {

void TransitionableCommandControl::getHWTraits(HWTraits& out, Status& status, bool refresh) {
  target_.getHWTraits(out, status, refresh);
}

void TransitionableCommandControl::setSettings(const HWSettings& settings, Status& status) {
  target_.setSettings(settings, status);
}

void TransitionableCommandControl::writeSettings(Status& status, bool force) { target_.writeSettings(status, force); }

void TransitionableCommandControl::commandInitiate(Status& status) { target_.commandInitiate(status); }

void TransitionableCommandControl::commandReset(Status& status) { target_.commandReset(status); }

void TransitionableCommandControl::commandAbort(Status& status) { target_.commandAbort(status); }

void TransitionableCommandControl::readGenerationDone(bool& out, Status& status) {
  target_.readGenerationDone(out, status);
}

void TransitionableCommandControl::readDataUnderflow(bool& out, Status& status) {
  target_.readDataUnderflow(out, status);
}

void TransitionableCommandControl::announceMemoryWrite(const MemoryWriteRequest& request, Status& status) {
  target_.announceMemoryWrite(request, status);
}

void TransitionableCommandControl::readMemoryWriteComplete(bool& out, Status& status) {
  target_.readMemoryWriteComplete(out, status);
}

void TransitionableCommandControl::resetStreamingWritePointer(Status& status) {
  target_.resetStreamingWritePointer(status);
}

std::uint64_t TransitionableCommandControl::readStreamingSpace(Status& status) {
  return target_.readStreamingSpace(status);
}

void TransitionableCommandControl::configure(bool force) {
  raisingLocated([&](Status& status) { target_.writeSettings(status, force); });
}

void TransitionableCommandControl::initiate() {
  raisingLocated([&](Status& status) { target_.commandInitiate(status); });
}

void TransitionableCommandControl::reset() {
  raisingLocated([&](Status& status) { target_.commandReset(status); });
}

void TransitionableCommandControl::abort() {
  raisingLocated([&](Status& status) { target_.commandAbort(status); });
}

}  // namespace ktorba
