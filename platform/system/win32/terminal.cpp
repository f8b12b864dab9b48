#include "platform/system/terminal.h"

#include <io.h>
#include <windows.h>

#include <atomic>
#include <cerrno>

namespace platform {
namespace {

std::atomic<bool> interrupted = false;

// The first interrupt is taken as handled, later ones go on to the system's handler, which ends the process.
BOOL WINAPI noteInterrupt(DWORD) { return interrupted.exchange(true) ? FALSE : TRUE; }

}  // namespace

void catchInterrupts() { SetConsoleCtrlHandler(noteInterrupt, TRUE); }

bool wasInterrupted() { return interrupted; }

void ignoreClosedPipes() {}

bool wasPipeClosed() { return errno == EPIPE || errno == EINVAL; }

bool isTerminal(std::FILE* stream) { return _isatty(_fileno(stream)) != 0; }

}  // namespace platform
