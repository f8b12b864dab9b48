// Sound files as sources, in every format that libsndfile reads.
#pragma once

#include "tools/sources/Source.h"

namespace tools {

// `channel` counts from 1; `source` is what messages call it.
LoadedWaveform loadSoundFile(const std::string& source, const std::string& path, int channel,
                             const SourceFormat& format);

// Whether libsndfile can open it for reading.
bool isSoundFile(const std::string& path);

}  // namespace tools
