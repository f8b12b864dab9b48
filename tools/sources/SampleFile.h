// Files of numbers as sources: CSV columns and raw samples.
#pragma once

#include "tools/sources/Source.h"

namespace tools {

// `selector` is a column number from 1 or a name of the first line, either with ",codes" behind it, or empty.
// Fields are parted by commas, semicolons or tabs (whichever the first line holds); blank lines and lines that begin
// with '#' are skipped.
LoadedWaveform loadCsvColumn(const std::string& source, const std::string& path, std::string selector,
                             const SourceFormat& format);

// Little-endian two's complement samples of the generator's width, nothing else in the file.
LoadedWaveform loadRawSamples(const std::string& source, const std::string& path, const SourceFormat& format);

}  // namespace tools
