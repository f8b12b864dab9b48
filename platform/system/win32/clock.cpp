#include "platform/system/clock.h"

#include <windows.h>

namespace platform {

std::uint64_t monotonicMilliseconds() { return GetTickCount64(); }

std::uint64_t monotonicTick() { return GetTickCount64(); }

}  // namespace platform
