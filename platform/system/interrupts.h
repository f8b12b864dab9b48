// How a command-line program ends when it is told to: by the signal itself, as shells expect, and without a half file
// left behind. For the main thread; the program may be anywhere when the signal comes.
#pragma once

#include <string>

namespace platform {

// From now on an interrupt (Ctrl-C, a request to terminate, the end of the terminal) removes the files that were named,
// and then ends the process as the system would have without this. A program that was started to outlive its terminal
// still does.
void endCleanlyOnInterrupts();

// One more file to remove; name it before it is made.
void removeOnInterrupt(const std::string& path);

// The file of that name is whole or gone: an interrupt leaves it alone from now on.
void keepOnInterrupt(const std::string& path);

}  // namespace platform
