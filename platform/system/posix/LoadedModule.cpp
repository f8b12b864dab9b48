#include "platform/system/LoadedModule.h"

#include <dlfcn.h>
#include <pthread.h>

namespace platform {

LoadedModule::LoadedModule(const std::string& path) : handle_(dlopen(path.c_str(), RTLD_NOW | RTLD_LOCAL)) {}

LoadedModule::~LoadedModule() {
  if (handle_ != nullptr) dlclose(handle_);
}

void* LoadedModule::find(const char* function) const { return handle_ != nullptr ? dlsym(handle_, function) : nullptr; }

std::uint32_t makeThreadSlot(void* value) {
  pthread_key_t slot = 0;
  pthread_key_create(&slot, nullptr);
  pthread_setspecific(slot, value);
  return slot;
}

}  // namespace platform
