// Memory of this process.
#pragma once

#include <cstdint>

// What it has in memory now; 0 where the system does not tell.
std::int64_t residentBytes();
