// Where a command writes what it makes. One thread at a time.
#pragma once

#include <vector>

#include "cli/commands/commands.h"
#include "tools/outputs/Output.h"

namespace tools::cli {

std::vector<OutputPlace> placesOf(const OutputOptions& options);

// Those of them that are pages to walk through, by their ending, and those that are not.
std::vector<OutputPlace> takePages(const std::vector<OutputPlace>& outputs);
std::vector<OutputPlace> takeOthers(const std::vector<OutputPlace>& outputs);

// Leaves the standard output to the one of them that it takes. Throws Refusal when there are several.
void takeStandardOutput(const std::vector<OutputPlace>& outputs);

}  // namespace tools::cli
