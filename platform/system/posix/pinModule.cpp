#include "platform/system/pinModule.h"

#include <dlfcn.h>

namespace platform {

// The handle is never closed: it is the pin, together with the flag that makes it one.
void pinModule(const void* address) {
  Dl_info module{};
  if (dladdr(address, &module) != 0) dlopen(module.dli_fname, RTLD_LAZY | RTLD_NOLOAD | RTLD_NODELETE);
}

}  // namespace platform
