#include "platform/system/programArguments.h"

#include <fcntl.h>
#include <io.h>
#include <windows.h>
// Behind what it needs of the above.
#include <shellapi.h>

#include <cstdio>
#include <cstdlib>
#include <memory>

#include "platform/system/win32/wideText.h"

namespace platform {
namespace {

using Words = std::unique_ptr<wchar_t*[], decltype([](wchar_t** words) { LocalFree(words); })>;

// What a console was set to, to be set again: it is shared with the programs that come after.
struct Console {
  DWORD handle;
  DWORD mode = 0;
  bool isThere = false;
};
Console consoles[] = {{STD_OUTPUT_HANDLE}, {STD_ERROR_HANDLE}};
UINT outputCodePage = 0;

void showColors(Console& console) {
  const HANDLE handle = GetStdHandle(console.handle);
  console.isThere = GetConsoleMode(handle, &console.mode) != 0;
  if (console.isThere) SetConsoleMode(handle, console.mode | ENABLE_VIRTUAL_TERMINAL_PROCESSING);
}

void restoreConsole() {
  for (const Console& console : consoles) {
    if (console.isThere) SetConsoleMode(GetStdHandle(console.handle), console.mode);
  }
  if (outputCodePage != 0) SetConsoleOutputCP(outputCodePage);
}

}  // namespace

std::vector<std::string> programArguments(int, const char* const*) {
  int count = 0;
  const Words words(CommandLineToArgvW(GetCommandLineW(), &count));
  std::vector<std::string> arguments;
  for (int i = 0; i < count; ++i) arguments.push_back(toUtf8(words[static_cast<std::size_t>(i)]));
  return arguments;
}

void useUtf8Streams() {
  for (std::FILE* const stream : {stdin, stdout, stderr}) _setmode(_fileno(stream), _O_BINARY);
  outputCodePage = GetConsoleOutputCP();
  SetConsoleOutputCP(CP_UTF8);
  for (Console& console : consoles) showColors(console);
  std::atexit(restoreConsole);
}

}  // namespace platform
