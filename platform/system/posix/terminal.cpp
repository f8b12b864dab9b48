#include "platform/system/terminal.h"

#include <unistd.h>

#include <cerrno>
#include <csignal>

namespace platform {
namespace {

volatile std::sig_atomic_t interrupted = 0;

extern "C" void noteInterrupt(int) { interrupted = 1; }

}  // namespace

void catchInterrupts() {
  struct sigaction action = {};
  action.sa_handler = noteInterrupt;
  action.sa_flags = static_cast<int>(SA_RESETHAND) | SA_RESTART;
  sigaction(SIGINT, &action, nullptr);
  sigaction(SIGTERM, &action, nullptr);
}

bool wasInterrupted() { return interrupted != 0; }

void ignoreClosedPipes() { std::signal(SIGPIPE, SIG_IGN); }

bool wasPipeClosed() { return errno == EPIPE; }

bool isTerminal(std::FILE* stream) { return isatty(fileno(stream)) == 1; }

}  // namespace platform
