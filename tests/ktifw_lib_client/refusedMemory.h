// The heap of this test program, which refuses memory on demand.
#pragma once

inline bool refuseMemory = false;
