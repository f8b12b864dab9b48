#include "platform/system/LoadedModule.h"

#include <windows.h>

#include "platform/system/paths.h"

namespace platform {

LoadedModule::LoadedModule(const std::string& path) : handle_(LoadLibraryW(toPath(path).c_str())) {}

LoadedModule::~LoadedModule() {
  if (handle_ != nullptr) FreeLibrary(static_cast<HMODULE>(handle_));
}

void* LoadedModule::find(const char* function) const {
  return handle_ != nullptr ? reinterpret_cast<void*>(GetProcAddress(static_cast<HMODULE>(handle_), function))
                            : nullptr;
}

std::uint32_t makeThreadSlot(void* value) {
  const DWORD slot = TlsAlloc();
  TlsSetValue(slot, value);
  return slot;
}

}  // namespace platform
