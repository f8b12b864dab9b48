#include "platform/system/terminal.h"

#include <sys/ioctl.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>

namespace platform {

void failOnWritesInVain() {
  std::signal(SIGPIPE, SIG_IGN);
  std::signal(SIGXFSZ, SIG_IGN);
}

bool wasPipeClosed() { return errno == EPIPE; }

bool isTerminal(std::FILE* stream) { return isatty(fileno(stream)) == 1; }

int terminalColumns(std::FILE* stream) {
  constexpr int kUsual = 80;
  winsize size = {};
  return ioctl(fileno(stream), TIOCGWINSZ, &size) == 0 && size.ws_col > 0 ? size.ws_col : kUsual;
}

}  // namespace platform
