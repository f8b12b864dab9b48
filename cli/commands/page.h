// Outputs that are pages to walk through: computed from the script, whatever was simulated. One thread.
#pragma once

#include <string>
#include <vector>

#include "cli/LoadedScript.h"
#include "tools/timeline/Timeline.h"

namespace tools::cli {

// Whether the path ends in .html, in any letter case.
bool isPage(const std::string& path);

// Writes the page of a built program; says on standard error when it holds waveforms as envelopes. Throws Refusal when
// the file cannot be written.
void writePageFile(const std::string& path, const std::string& title, const LoadedScript& loaded,
                   const Program& program, const GeneratorOptions& generator, const std::vector<RaisedTrigger>& raised);

}  // namespace tools::cli
