#include "platform/system/DynamicLibrary.h"

#include <windows.h>

#include <filesystem>
#include <iterator>
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

void DynamicLibrary::searchBesideProgram(const std::string& folder) {
  wchar_t program[32768] = {};  // the longest path that there is
  const DWORD length = GetModuleFileNameW(nullptr, program, static_cast<DWORD>(std::size(program)));
  if (length == 0 || length == std::size(program)) return;
  SetDllDirectoryW((std::filesystem::path(program).parent_path() / folder).make_preferred().c_str());
}

std::string DynamicLibrary::placesSearched() {
  return "looked for among the libraries loaded, in the program's folder, those of the system, and the PATH";
}

}  // namespace platform
