#include "platform/system/pinModule.h"

#include <dlfcn.h>

namespace platform {

// The handle is never closed: it is the pin, together with the flag that makes it one.
void pinModule(const void* address) {
  Dl_info module{};
  if (dladdr(address, &module) != 0) dlopen(module.dli_fname, RTLD_LAZY | RTLD_NOLOAD | RTLD_NODELETE);
}

// Closing the handle gives back the count that opening it took; its value stays that of the library.
void* moduleOf(const void* address) {
  Dl_info module{};
  if (dladdr(address, &module) == 0) return nullptr;
  void* const handle = dlopen(module.dli_fname, RTLD_LAZY | RTLD_NOLOAD);
  if (handle != nullptr) dlclose(handle);
  return handle;
}

}  // namespace platform
