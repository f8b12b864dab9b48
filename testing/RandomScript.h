// Random valid scripts with waveforms for them.
#pragma once

#include <string>

#include "testing/ReferencePlayer.h"
#include "testing/seeds.h"

namespace scripts {

// One to five waveforms of `minLength` to `maxLength` samples of `sampleWidthBits`.
Waveforms randomWaveforms(Random& random, std::uint32_t minLength, std::uint32_t maxLength, unsigned sampleWidthBits);

// The text of one script named "main" that compiles against `waveforms` on a generator of that minimum length.
std::string randomScript(Random& random, const Waveforms& waveforms, std::uint32_t minFetchSamples);

}  // namespace scripts
