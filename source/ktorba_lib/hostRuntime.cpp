#include "source/ktorba_lib/hostRuntime.h"

#include "ktorba/ktorba.h"
#include "platform/system/HostRuntime.h"
#include "platform/system/pinModule.h"

namespace ktorba_lib {
namespace {

using platform::HostRuntime;

constinit HostRuntime hostRuntime;

std::int32_t closeSession(std::uint32_t handle) {
  closeOrbaSession(handle, nullptr);
  return 0;
}

// A host runtime may call closeSession() at any time from here on, also when the library has been unloaded.
void stayLoaded() {
  [[maybe_unused]] static const bool isPinned =
      (platform::pinModule(reinterpret_cast<const void*>(closeSession)), true);
}

// The runtime's answer; 0, which refuses, when it throws.
std::int32_t request(std::uint32_t handle, HostRuntime::Mode mode) noexcept try {
  return hostRuntime.registerCleanUp(closeSession, handle, mode);
} catch (...) {
  return 0;
}

}  // namespace

bool registerCleanUp(std::uint32_t handle) noexcept {
  stayLoaded();
  return request(handle, HostRuntime::Mode::kRegister) != 0;
}

void withdrawCleanUp(std::uint32_t handle) noexcept { request(handle, HostRuntime::Mode::kWithdraw); }

}  // namespace ktorba_lib

void SetPDRNModule(void* module) {
  ktorba_lib::hostRuntime.setModule(module);
  SetPDRNModuleHook();
}

void SetPDRNTLSIndex(std::uint32_t index) {
  ktorba_lib::hostRuntime.setThreadSlot(index);
  SetPDRNModuleHook();
}
