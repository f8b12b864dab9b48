// The command line: its definition, once, for running and for everything that is derived from it.
#pragma once

namespace cli {

// Runs the tool and returns its exit code: 0, 1 for errors in what it was given, 2 for a wrong command line. Prints
// all messages itself.
int runTool(int argc, const char* const* argv);

}  // namespace cli
