#include "platform/system/residentMemory.h"

#include <unistd.h>

#include <fstream>

namespace platform {

std::int64_t residentBytes() {
  std::int64_t pages = 0;
  std::ifstream("/proc/self/statm").ignore(64, ' ') >> pages;
  return pages * sysconf(_SC_PAGESIZE);
}

}  // namespace platform
