// The command line: its definition, once, for running and for everything that is derived from it.
#pragma once

#include <string>
#include <vector>

namespace tools::cli {

struct OptionHelp {
  std::string shortName;    // "-w"; may be empty
  std::string longName;     // "--waveform"; empty for what is given without a name
  std::string value;        // what stands behind it, "NAME=SOURCE"; empty for flags
  std::string description;  // without a full stop
};

struct CommandHelp {
  std::string name;  // empty for the tool itself
  std::string description;
  std::vector<OptionHelp> options;
  std::string remarks;  // explanations and examples as --help shows them
};

// The tool itself, then its commands.
std::vector<CommandHelp> describeCommands();

// Runs the tool and returns its exit code: 0, 1 for errors in what it was given, 2 for a wrong command line. Prints
// all messages itself.
int runTool(int argc, const char* const* argv);

}  // namespace tools::cli
