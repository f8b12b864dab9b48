// The heap of programs that link ktorba_watched_heap: it counts blocks and refuses memory on demand. Not for several
// threads.
#pragma once

#include <cstdint>

namespace heap {

inline std::int64_t liveBlocks = 0;      // taken from operator new and not given back, those of libraries included
inline bool isRefusing = false;          // every request
inline std::int64_t refusedRequest = 0;  // of the requests made while isCounting, the n-th from now on; 0: none
inline bool isCounting = false;

}  // namespace heap
