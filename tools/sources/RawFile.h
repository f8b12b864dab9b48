// Raw samples as sources: little-endian two's complement of the generator's width, nothing else in the file.
#pragma once

#include "tools/sources/Parameters.h"
#include "tools/sources/Source.h"

namespace tools {

LoadedWaveform loadRawSamples(const std::string& path, Parameters& parameters, const SourceFormat& format);

}  // namespace tools
