#include "platform/system/hostRuntimeSystem.h"

#include <windows.h>

namespace platform {
namespace {

#define KTORBA_NO_RUNTIME                                                                                    \
  "There is no host runtime: neither the module given to SetPDRNModule, nor the thread-local slot given to " \
  "SetPDRNTLSIndex, nor this program exports PDRNRegisterCleanUpProc. A host that brings no runtime of its " \
  "own takes ktorba_host_runtime.dll, and calls ktHostRuntime_Announce(SetPDRNModule, atexit) when it starts."

// A box on the window station of a service would wait for ever for somebody to press its button.
bool isDesktopSeen() {
  USEROBJECTFLAGS flags = {};
  return GetUserObjectInformationW(GetProcessWindowStation(), UOI_FLAGS, &flags, sizeof(flags), nullptr) != 0 &&
         (flags.dwFlags & WSF_VISIBLE) != 0;
}

bool showOnDesktop() {
  return isDesktopSeen() &&
         MessageBoxW(nullptr, L"" KTORBA_NO_RUNTIME, L"ktorba: fatal error", MB_OK | MB_ICONERROR | MB_TASKMODAL) > 0;
}

void writeToStandardError() {
  static constexpr char kText[] = "ktorba: fatal error: " KTORBA_NO_RUNTIME "\r\n";
  DWORD written = 0;
  WriteFile(GetStdHandle(STD_ERROR_HANDLE), kText, sizeof(kText) - 1, &written, nullptr);
}

}  // namespace

void* threadSlotValue(std::uint32_t index) { return TlsGetValue(index); }

void* findInModule(void* module, const char* function) {
  return module != nullptr ? reinterpret_cast<void*>(GetProcAddress(static_cast<HMODULE>(module), function)) : nullptr;
}

// The executable that made the process; it need not be the module that loaded this library.
void* findInProcess(const char* function) { return findInModule(GetModuleHandleW(nullptr), function); }

std::int32_t withoutHostRuntime() {
  if (!showOnDesktop()) writeToStandardError();
  ExitProcess(1);
}

}  // namespace platform
