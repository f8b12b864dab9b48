#include <atomic>
#include <cstdlib>

#include "hostRuntime/CleanUpList.h"
#include "ktorba/host_runtime.h"
#include "platform/system/HostRuntime.h"
#include "platform/system/pinModule.h"

namespace host_runtime {
namespace {

CleanUpList list;
std::atomic<AtExit> programsAtExit{nullptr};
std::atomic<bool> isEndAwaited{false};

// Only now, with the first procedure: what a library makes while it opens a session is destroyed later than this runs,
// since the end of a program goes backwards.
void awaitEnd() {
  if (isEndAwaited.exchange(true)) return;
  const AtExit atExit = programsAtExit;
  (atExit != nullptr ? atExit : &std::atexit)(ktHostRuntime_CleanUp);
}

std::int32_t add(CleanUpProcedure procedure, std::uint32_t handle) noexcept try {
  list.add(procedure, handle);
  awaitEnd();
  return 1;
} catch (...) {
  return 0;
}

}  // namespace
}  // namespace host_runtime

std::int32_t ktHostRuntime_Announce(void (*setModule)(void* module), int (*atExit)(void (*function)())) {
  const auto* const self = reinterpret_cast<const void*>(PDRNRegisterCleanUpProc);
  const void* const ofProcess = platform::HostRuntime::findInHostProcess();
  if (ofProcess != nullptr && ofProcess != self) return 0;
  platform::pinModule(self);
  host_runtime::programsAtExit = atExit;
  setModule(platform::moduleOf(self));
  return 1;
}

void ktHostRuntime_CleanUp() {
  host_runtime::isEndAwaited = false;
  host_runtime::list.runAll();
}

std::int32_t PDRNRegisterCleanUpProc(std::int32_t (*procedure)(std::uint32_t handle), std::uint32_t handle,
                                     std::int32_t mode) {
  using Mode = platform::HostRuntime::Mode;
  if (procedure == nullptr) return 0;
  if (mode == static_cast<std::int32_t>(Mode::kRegister)) return host_runtime::add(procedure, handle);
  return mode == static_cast<std::int32_t>(Mode::kWithdraw) && host_runtime::list.remove(procedure, handle) ? 1 : 0;
}
