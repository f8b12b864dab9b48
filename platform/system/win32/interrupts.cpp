#include "platform/system/interrupts.h"

#include <windows.h>

#include <mutex>

namespace platform {
namespace {

// The system calls the handler in a thread of its own.
std::mutex mutex;
std::string fileToRemove;

// Leaves the rest to the system's own handler, which ends the process.
BOOL WINAPI removeNotedFile(DWORD) {
  const std::lock_guard lock(mutex);
  if (!fileToRemove.empty()) DeleteFileA(fileToRemove.c_str());
  return FALSE;
}

}  // namespace

void endCleanlyOnInterrupts() { SetConsoleCtrlHandler(removeNotedFile, TRUE); }

void removeOnInterrupt(const std::string& path) {
  const std::lock_guard lock(mutex);
  fileToRemove = path;
}

void keepOnInterrupt() { removeOnInterrupt({}); }

}  // namespace platform
