// How a command-line program begins: its arguments, and what its standard streams carry. For the main thread, first
// thing.
#pragma once

#include <string>
#include <vector>

namespace platform {

// The arguments as UTF-8, the program's name first, whatever the system's encoding. On Windows they are the system's
// own, and those given here are not looked at.
std::vector<std::string> programArguments(int argc, const char* const* argv);

// From now on the standard streams carry bytes as they are written and read, and terminals show them as UTF-8, with
// colours. What was set of the terminal before is set again when the program ends.
void useUtf8Streams();

}  // namespace platform
