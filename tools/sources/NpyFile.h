// Arrays as sources: .npy files, and those within .npz archives.
//
// Integers of the generator's width are sample codes, floating-point numbers fractions of full scale. What other
// integers are is not guessed: codes, full-scale= or normalise says it. Arrays of two dimensions are columns, one of
// which is chosen by its number from 1.
#pragma once

#include "tools/sources/Parameters.h"
#include "tools/sources/Source.h"

namespace tools {

LoadedWaveform loadNpyFile(const std::string& path, Parameters& parameters, const SourceFormat& format);

// `member` chooses one of the arrays where there are several, the column is column=.
LoadedWaveform loadNpzFile(const std::string& path, Parameters& parameters, const SourceFormat& format);

}  // namespace tools
