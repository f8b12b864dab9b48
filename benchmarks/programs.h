// The same program in four languages: as many instructions, of the same kinds as far as a language has them.
#pragma once

#include <string>

namespace programs {

// A unit of eight instructions, of which two stand in a loop, is written as often as fits, on `waveforms` names.
inline constexpr int kInstructionsPerUnit = 8;
inline constexpr int kWaveforms = 100;

std::string script(int instructions);
std::string lua(int instructions);
std::string spirv(int instructions);        // additions in one function
std::string webAssembly(int instructions);  // the same

}  // namespace programs
