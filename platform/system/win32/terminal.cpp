#include "platform/system/terminal.h"

#include <io.h>
#include <windows.h>

#include <cerrno>

namespace platform {

void failOnWritesInVain() {}

bool wasPipeClosed() { return errno == EPIPE || errno == EINVAL; }

bool isTerminal(std::FILE* stream) { return _isatty(_fileno(stream)) != 0; }

int terminalColumns(std::FILE* stream) {
  constexpr int kUsual = 80;
  CONSOLE_SCREEN_BUFFER_INFO screen = {};
  const auto console = reinterpret_cast<HANDLE>(_get_osfhandle(_fileno(stream)));
  return GetConsoleScreenBufferInfo(console, &screen) != 0 ? screen.srWindow.Right - screen.srWindow.Left + 1 : kUsual;
}

}  // namespace platform
