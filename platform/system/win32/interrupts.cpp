#include "platform/system/interrupts.h"

#include <windows.h>

#include <mutex>
#include <set>

namespace platform {
namespace {

// The system calls the handler in a thread of its own.
std::mutex mutex;
std::set<std::string> filesToRemove;

// Leaves the rest to the system's own handler, which ends the process.
BOOL WINAPI removeNotedFiles(DWORD) {
  const std::lock_guard lock(mutex);
  for (const std::string& path : filesToRemove) DeleteFileA(path.c_str());
  return FALSE;
}

}  // namespace

void endCleanlyOnInterrupts() { SetConsoleCtrlHandler(removeNotedFiles, TRUE); }

void removeOnInterrupt(const std::string& path) {
  const std::lock_guard lock(mutex);
  filesToRemove.insert(path);
}

void keepOnInterrupt(const std::string& path) {
  const std::lock_guard lock(mutex);
  filesToRemove.erase(path);
}

}  // namespace platform
