// Man page and shell completions, made from the definition of the command line.
#pragma once

#include <string>
#include <vector>

#include "cli/commandLine.h"

namespace tools::cli {

std::string makeManPage(const std::vector<CommandHelp>& commands, const std::string& version);
std::string makeBashCompletion(const std::vector<CommandHelp>& commands);
std::string makeZshCompletion(const std::vector<CommandHelp>& commands);
std::string makeFishCompletion(const std::vector<CommandHelp>& commands);

}  // namespace tools::cli
