#include "source/ktorba_lib/hostRuntime.h"

#include "ktorba/ktorba.h"
#include "platform/system/HostRuntime.h"

namespace ktorba_lib {
namespace {

using platform::HostRuntime;

constinit HostRuntime hostRuntime;

std::int32_t closeSession(std::uint32_t handle) {
  ktORBA_CloseOrbaSession(handle, nullptr);
  return 0;
}

}  // namespace

bool registerCleanUp(std::uint32_t handle) {
  return hostRuntime.registerCleanUp(closeSession, handle, HostRuntime::Mode::kRegister) != 0;
}

void withdrawCleanUp(std::uint32_t handle) {
  hostRuntime.registerCleanUp(closeSession, handle, HostRuntime::Mode::kWithdraw);
}

}  // namespace ktorba_lib

void SetPDRNModule(void* module) {
  ktorba_lib::hostRuntime.setModule(module);
  SetPDRNModuleHook();
}

void SetPDRNTLSIndex(std::uint32_t index) {
  ktorba_lib::hostRuntime.setThreadSlot(index);
  SetPDRNModuleHook();
}

void SetPDRNModuleHook() {}

void SetPDRNTLSIndexHook() {}
