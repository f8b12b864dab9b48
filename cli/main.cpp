#include <cstdlib>

#include "cli/commandLine.h"
#include "ktorba/host_runtime.h"
#include "ktorba/ktorba.h"
#include "platform/system/DynamicLibrary.h"

int main(int argc, char** argv) {
  platform::DynamicLibrary::searchBesideProgram("ktorba/simulator");
  ktHostRuntime_Announce(SetPDRNModule, std::atexit);
  return tools::cli::runTool(argc, argv);
}
