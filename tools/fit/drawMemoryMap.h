// A picture of sample memory as SVG: its blocks to scale, and a table of them. Text is text, and nothing depends on
// colour. Pure; any thread may call.
#pragma once

#include <string>

#include "tools/fit/Fit.h"

namespace tools {

// `title`: of what is shown, a file's name say.
std::string drawMemoryMap(const Fit& fit, const std::string& title);

}  // namespace tools
