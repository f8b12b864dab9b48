// The host runtime that loads this library and may end the calling program at any time: it keeps a clean-up procedure
// for each open handle. Its registration function, PDRNRegisterCleanUpProc, is looked for on first use in the module
// whose handle the thread-local slot holds, in the module given, in the host process; once found it is kept. Where
// nothing has it, POSIX systems go without (registration succeeds and does nothing, and the search is made again the
// next time); on Windows a message box tells the user, or the standard error where there is no desktop, and the process
// ends with exit code 1.
// Any thread may call anything; no lock is held while the host runtime runs.
#pragma once

#include <atomic>
#include <cstdint>

namespace platform {

class HostRuntime {
 public:
  using CleanUpProcedure = std::int32_t (*)(std::uint32_t handle);

  // Whether `procedure` may run later; how the runtime numbers the two requests.
  enum class Mode : std::int32_t { kWithdraw = 0, kRegister = 2 };

  static constexpr std::uint32_t kNoThreadSlot = 0xFFFFFFFF;

  void setModule(void* module) { module_ = module; }                // a loader's handle, not owned; null: none
  void setThreadSlot(std::uint32_t index) { threadSlot_ = index; }  // pthread_key_t or TLS index

  // The registration function of the host process, or null: what is found where nothing else was told.
  static void* findInHostProcess();

  // Hands the request to the runtime and returns its answer; 0 refuses a registration.
  std::int32_t registerCleanUp(CleanUpProcedure procedure, std::uint32_t handle, Mode mode);

 private:
  using Registration = std::int32_t (*)(CleanUpProcedure procedure, std::uint32_t handle, std::int32_t mode);

  Registration registration();

  std::atomic<void*> module_{nullptr};
  std::atomic<std::uint32_t> threadSlot_{kNoThreadSlot};
  std::atomic<Registration> registration_{nullptr};  // null until found
};

}  // namespace platform
