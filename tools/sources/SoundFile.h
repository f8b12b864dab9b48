// Sound files as sources, in every format that libsndfile reads.
#pragma once

#include "tools/sources/Parameters.h"
#include "tools/sources/Source.h"

namespace tools {

// A channel, from 1, is chosen by its number or channel=.
LoadedWaveform loadSoundFile(const std::string& path, Parameters& parameters, const SourceFormat& format);

// Whether libsndfile can open it for reading.
bool isSoundFile(const std::string& path);

}  // namespace tools
