#include "platform/clock.h"

#include <windows.h>

namespace platform {

std::uint64_t monotonicMilliseconds() { return GetTickCount64(); }

}  // namespace platform
