// How long a script plays, in words. Pure functions; any thread may call.
#pragma once

#include <string>

#include "tools/timeline/PlayLength.h"
#include "tools/timeline/StraightPlay.h"

namespace tools {

// With no trigger raised.
PlayLength lengthOf(const Program& program, const ProgramBuilder& builder);

// "plays 1.2 ms, 1 200 samples", "plays for ever", "waits for trigger2 at line 5 from 264 µs on, sample 264" and the
// like.
std::string describeLength(const PlayLength& length, const Program& program, double sampleRateHz);

// Whether it waits in a loop that repeats until the trigger comes, and not in an instruction.
bool waitsInLoop(const PlayLength& length, const Program& program);

}  // namespace tools
