#include "cli/commandLine.h"

int main(int argc, char** argv) { return cli::runTool(argc, argv); }
