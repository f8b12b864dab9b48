#include "platform/system/programArguments.h"

namespace platform {

std::vector<std::string> programArguments(int argc, const char* const* argv) { return {argv, argv + argc}; }

void useUtf8Streams() {}

}  // namespace platform
