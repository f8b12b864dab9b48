// Sample memory in words and characters. Pure functions; any thread may call.
#pragma once

#include <string>

#include "tools/fit/MemoryMap.h"

namespace tools {

// "784 of 67 108 864 bytes (0.0 %)".
std::string describeUse(const MemoryMap& map);
// "3 holes, the largest of 512 bytes (256 samples), fragmentation 12.5 %", or "no hole".
std::string describeHoles(const MemoryMap& map);
// "pulse could be 256 samples longer, all others staying", of the longest waveform; empty where there is no waveform.
std::string describeLongest(const MemoryMap& map);

// The memory to scale in at most that many characters, at least one. Neighbouring waveforms have different shades; a
// third one stands where less than half is used, a fourth for free memory.
std::string memoryBar(const MemoryMap& map, int columns);

}  // namespace tools
