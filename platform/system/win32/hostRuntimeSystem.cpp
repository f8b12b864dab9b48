#include "platform/system/hostRuntimeSystem.h"

#include <windows.h>

namespace platform {

void* threadSlotValue(std::uint32_t index) { return TlsGetValue(index); }

void* findInModule(void* module, const char* function) {
  return module != nullptr ? reinterpret_cast<void*>(GetProcAddress(static_cast<HMODULE>(module), function)) : nullptr;
}

// The executable that made the process; it need not be the module that loaded this library.
void* findInProcess(const char* function) { return findInModule(GetModuleHandleW(nullptr), function); }

std::int32_t withoutHostRuntime() {
  MessageBoxW(nullptr, L"The host runtime does not provide PDRNRegisterCleanUpProc.", L"ktorba: fatal error",
              MB_OK | MB_ICONERROR | MB_TASKMODAL);
  ExitProcess(1);
}

}  // namespace platform
