#include "cli/commandLine.h"

int main(int argc, char** argv) { return tools::cli::runTool(argc, argv); }
