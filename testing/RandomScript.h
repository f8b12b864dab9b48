// Random valid scripts with waveforms for them.
#pragma once

#include <random>
#include <string>

#include "testing/ReferencePlayer.h"

namespace scripts {

using Random = std::mt19937_64;

// Uniform over low to high, both included.
std::uint32_t pick(Random& random, std::uint32_t low, std::uint32_t high);

// One to five waveforms of `minLength` to `maxLength` samples of `sampleWidthBits`.
Waveforms randomWaveforms(Random& random, std::uint32_t minLength, std::uint32_t maxLength, unsigned sampleWidthBits);

// The text of one script named "main" that compiles against `waveforms` on a generator of that minimum length.
std::string randomScript(Random& random, const Waveforms& waveforms, std::uint32_t minFetchSamples);

}  // namespace scripts
