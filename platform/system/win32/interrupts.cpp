#include "platform/system/interrupts.h"

#include <windows.h>

#include <mutex>
#include <set>

#include "platform/system/paths.h"

namespace platform {
namespace {

// The system calls the handler in a thread of its own.
std::mutex mutex;
std::set<std::filesystem::path> filesToRemove;

// Leaves the rest to the system's own handler, which ends the process.
BOOL WINAPI removeNotedFiles(DWORD) {
  const std::lock_guard lock(mutex);
  for (const std::filesystem::path& path : filesToRemove) DeleteFileW(path.c_str());
  return FALSE;
}

}  // namespace

void endCleanlyOnInterrupts() { SetConsoleCtrlHandler(removeNotedFiles, TRUE); }

void removeOnInterrupt(const std::string& path) {
  const std::lock_guard lock(mutex);
  filesToRemove.insert(toPath(path));
}

void keepOnInterrupt(const std::string& path) {
  const std::lock_guard lock(mutex);
  filesToRemove.erase(toPath(path));
}

}  // namespace platform
