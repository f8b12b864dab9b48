#include "platform/system/DynamicLibrary.h"

#include <dlfcn.h>

namespace platform {
namespace {

std::string lastError() {
  const char* words = dlerror();
  return words != nullptr ? words : "the loader gave no reason";
}

}  // namespace

DynamicLibrary::DynamicLibrary(const char* stem)
    : handle_(dlopen(("lib" + std::string(stem) + ".so").c_str(), RTLD_NOW | RTLD_LOCAL)) {
  if (handle_ == nullptr) loadError_ = lastError();
}

void* DynamicLibrary::find(const char* function, std::string& error) const {
  if (handle_ == nullptr) {
    error = loadError_;
    return nullptr;
  }
  void* address = dlsym(handle_, function);
  if (address == nullptr) error = lastError();
  return address;
}

}  // namespace platform
