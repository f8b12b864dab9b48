#include "platform/system/HostRuntime.h"

#include "platform/system/hostRuntimeSystem.h"

namespace platform {
namespace {

constexpr char kRegistration[] = "PDRNRegisterCleanUpProc";

}  // namespace

void* HostRuntime::findInHostProcess() { return findInProcess(kRegistration); }

std::int32_t HostRuntime::registerCleanUp(CleanUpProcedure procedure, std::uint32_t handle, Mode mode) {
  const Registration request = registration();
  return request != nullptr ? request(procedure, handle, static_cast<std::int32_t>(mode)) : withoutHostRuntime();
}

HostRuntime::Registration HostRuntime::registration() {
  if (const Registration known = registration_) return known;
  const std::uint32_t slot = threadSlot_;
  void* found = slot != kNoThreadSlot ? findInModule(threadSlotValue(slot), kRegistration) : nullptr;
  if (found == nullptr) found = findInModule(module_, kRegistration);
  if (found == nullptr) found = findInHostProcess();
  const auto result = reinterpret_cast<Registration>(found);
  if (result != nullptr) registration_ = result;
  return result;
}

}  // namespace platform
