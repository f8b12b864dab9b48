#include "platform/system/residentMemory.h"

#include <windows.h>
// Behind what it needs of the above.
#include <psapi.h>

namespace platform {

std::int64_t residentBytes() {
  PROCESS_MEMORY_COUNTERS counters = {};
  const BOOL isKnown = K32GetProcessMemoryInfo(GetCurrentProcess(), &counters, sizeof(counters));
  return isKnown != 0 ? static_cast<std::int64_t>(counters.WorkingSetSize) : 0;
}

}  // namespace platform
