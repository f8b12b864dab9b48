// What callers of the C interface describe in JSON: generators, waveforms, and what a host does with them.
#pragma once

#include <cstdint>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "tools/fit/Fit.h"
#include "tools/program/GeneratorOptions.h"
#include "tools/program/ProgramBuilder.h"

namespace tools {

// A description that is no JSON, or not what it should be: what() says what and where.
class RequestError : public std::runtime_error {
  using std::runtime_error::runtime_error;
};

// An empty text describes the generator of all defaults, no waveforms, and a host that does nothing besides placing
// them. All throw RequestError.
GeneratorOptions readGenerator(std::string_view text);
std::vector<WaveformLength> readWaveforms(std::string_view text);
FitRequest readFitRequest(std::string_view text, double sampleRateHz);

// As measureFit(), but throws RequestError where a name of the request is that of no waveform.
Fit measureRequestedFit(ProgramBuilder& builder, const std::vector<WaveformLength>& waveforms,
                        const GeneratorOptions& generator, const FitRequest& request);

}  // namespace tools
