// Triggers as users raise them, and those that a script asks for. Pure functions; any thread may call.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "tools/timeline/Folding.h"
#include "tools/timeline/StraightPlay.h"

namespace tools {

// "trigger3@20ms" or "trigger3@5000" each, to be raised at a sample or a time after the start; ascending. Throws
// Refusal for what is of another form, and for times that are negative or beyond what can be counted.
std::vector<RaisedTrigger> readTriggers(const std::vector<std::string>& arguments, double sampleRateHz);

// The hardware triggers that the script waits for or repeats until: bit h-1 is that of trigger h. The start trigger,
// which every script waits for, is not among them.
std::uint8_t awaitedTriggers(const StraightPlay& play);

}  // namespace tools
