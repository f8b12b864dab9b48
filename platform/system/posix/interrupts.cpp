#include "platform/system/interrupts.h"

#include <unistd.h>

#include <atomic>
#include <csignal>

namespace platform {
namespace {

// The handler may run between any two steps of the program, so that entries stay, and stay where they are: one is made
// whole before it can be found, serves again once its file is kept, and is never freed.
struct NotedFile {
  std::string path;
  std::atomic<bool> isNoted = true;
  NotedFile* next = nullptr;
};
std::atomic<NotedFile*> notedFiles;
static_assert(std::atomic<NotedFile*>::is_always_lock_free && std::atomic<bool>::is_always_lock_free,
              "a signal handler may read it");

// Calls only what a signal handler may. The signal is blocked until the handler returns, and then ends the process.
extern "C" void endByInterrupt(int signal) {
  for (const NotedFile* file = notedFiles; file != nullptr; file = file->next) {
    if (file->isNoted) unlink(file->path.c_str());
  }
  std::signal(signal, SIG_DFL);
  raise(signal);
}

NotedFile* findUnused() {
  NotedFile* file = notedFiles;
  while (file != nullptr && file->isNoted) file = file->next;
  return file;
}

}  // namespace

void endCleanlyOnInterrupts() {
  std::signal(SIGINT, endByInterrupt);
  std::signal(SIGTERM, endByInterrupt);
  if (std::signal(SIGHUP, endByInterrupt) == SIG_IGN) std::signal(SIGHUP, SIG_IGN);
}

void removeOnInterrupt(const std::string& path) {
  if (NotedFile* const unused = findUnused()) {
    unused->path = path;
    unused->isNoted = true;
    return;
  }
  notedFiles = new NotedFile{path, true, notedFiles};
}

void keepOnInterrupt(const std::string& path) {
  for (NotedFile* file = notedFiles; file != nullptr; file = file->next) {
    if (file->path == path) file->isNoted = false;
  }
}

}  // namespace platform
