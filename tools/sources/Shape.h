// Built-in waveform shapes.
#pragma once

#include "tools/sources/Source.h"

namespace tools {

bool isShapeName(std::string_view name);

// The names of all shapes, in the order of the help.
std::vector<std::string> shapeNames();

// `parameters` is what stands behind the colon: "length=1000,cycles=10". Throws Refusal.
LoadedWaveform makeShape(const std::string& source, std::string_view name, std::string_view parameters,
                         const SourceFormat& format);

}  // namespace tools
