// Memory of this process. Any thread may ask.
#pragma once

#include <cstdint>

namespace platform {

// What it has in memory now; 0 where the system does not tell.
std::int64_t residentBytes();

}  // namespace platform
