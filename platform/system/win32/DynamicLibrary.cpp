#include "platform/system/DynamicLibrary.h"

#include <windows.h>

#include <system_error>

namespace platform {
namespace {

std::string lastError() { return std::system_category().message(static_cast<int>(GetLastError())); }

}  // namespace

DynamicLibrary::DynamicLibrary(const char* stem)
    : name_(std::string(stem) + ".dll"), handle_(LoadLibraryA(name_.c_str())) {
  if (handle_ == nullptr) loadError_ = lastError();
}

void* DynamicLibrary::find(const char* function, std::string& error) const {
  if (handle_ == nullptr) {
    error = loadError_;
    return nullptr;
  }
  void* address = reinterpret_cast<void*>(GetProcAddress(static_cast<HMODULE>(handle_), function));
  if (address == nullptr) error = lastError();
  return address;
}

std::string DynamicLibrary::placesSearched() {
  return "looked for among the libraries loaded, in the program's folder, those of the system, and the PATH";
}

}  // namespace platform
