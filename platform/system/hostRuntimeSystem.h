// What finding the host runtime takes of the operating system. Internal to platform/system/HostRuntime.cpp: use
// platform/system/HostRuntime.h instead.
#pragma once

#include <cstdint>

namespace platform {

// What the calling thread keeps in the slot; null when nothing.
void* threadSlotValue(std::uint32_t index);

// A function's address, or null. A null module has none.
void* findInModule(void* module, const char* function);
void* findInProcess(const char* function);

// The answer where there is no host runtime: accepted (POSIX), or the end of the process (Windows).
std::int32_t withoutHostRuntime();

}  // namespace platform
