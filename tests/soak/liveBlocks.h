// Counts what the process has from operator new and has not given back, the libraries' blocks included. Any thread.
#pragma once

#include <cstdint>

namespace soak {

std::int64_t liveBlocks();

}  // namespace soak
