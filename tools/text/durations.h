// How long samples last, as exact decimal numbers where there are such. Pure functions; any thread may call.
#pragma once

#include <cstdint>
#include <string>

namespace tools {

// Seconds, "0.0012": exact where that takes at most 30 decimals, else rounded to 15. The rate is from 1e-3 to 1e17, and
// the shortest decimal number that reads back as it is what is meant.
std::string secondsOf(std::uint64_t samples, double sampleRateHz);

// The same for people: "1.2 ms", or "about 22.67573696 ms" where it is not exact.
std::string formatDuration(std::uint64_t samples, double sampleRateHz);

}  // namespace tools
