#include "platform/system/interrupts.h"

#include <limits.h>
#include <unistd.h>

#include <csignal>

namespace platform {
namespace {

char fileToRemove[PATH_MAX];
volatile std::sig_atomic_t isFileNoted = 0;

// Calls only what a signal handler may. The signal is blocked until the handler returns, and then ends the process.
extern "C" void endByInterrupt(int signal) {
  if (isFileNoted != 0) unlink(fileToRemove);
  std::signal(signal, SIG_DFL);
  raise(signal);
}

}  // namespace

void endCleanlyOnInterrupts() {
  std::signal(SIGINT, endByInterrupt);
  std::signal(SIGTERM, endByInterrupt);
  if (std::signal(SIGHUP, endByInterrupt) == SIG_IGN) std::signal(SIGHUP, SIG_IGN);
}

void removeOnInterrupt(const std::string& path) {
  isFileNoted = 0;
  if (path.size() >= sizeof(fileToRemove)) return;
  fileToRemove[path.copy(fileToRemove, path.size())] = '\0';
  isFileNoted = 1;
}

void keepOnInterrupt() { isFileNoted = 0; }

}  // namespace platform
