// A shared library that is loaded by its path and unloaded again, and the thread-local slots in which hosts keep such
// modules: what hosts do, for tests that play one. One thread at a time.
#pragma once

#include <cstdint>
#include <string>

namespace platform {

class LoadedModule {
 public:
  explicit LoadedModule(const std::string& path);
  ~LoadedModule();
  LoadedModule(const LoadedModule&) = delete;
  LoadedModule& operator=(const LoadedModule&) = delete;

  void* handle() const { return handle_; }  // dlopen handle, HMODULE; null when it could not be loaded
  void* find(const char* function) const;   // null when the module has none

 private:
  void* handle_;
};

// A new thread-local slot, which holds `value` for this thread.
std::uint32_t makeThreadSlot(void* value);

}  // namespace platform
