// What callers of the C interface describe in JSON: generators and waveforms.
#pragma once

#include <cstdint>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "tools/program/GeneratorOptions.h"
#include "tools/program/ProgramBuilder.h"

namespace tools {

// A description that is no JSON, or not what it should be: what() says what and where.
class RequestError : public std::runtime_error {
  using std::runtime_error::runtime_error;
};

// An empty text describes the generator of all defaults, and no waveforms. Both throw RequestError.
GeneratorOptions readGenerator(std::string_view text);
std::vector<WaveformLength> readWaveforms(std::string_view text);

}  // namespace tools
