// Writes the pages of the manual and the completions into a folder, while the tool is built:
//   ktorba_documents VERSION FOLDER SCRIPT-LANGUAGE.md
#include <cstdio>
#include <fstream>
#include <iterator>
#include <string>

#include "cli/documents.h"
#include "cli/scriptPage.h"
#include "tools/outputs/OutputFile.h"

namespace {

void write(const std::string& path, const std::string& text) {
  tools::OutputFile file(path);
  file.write(text.data(), text.size());
  file.commit();
}

std::string read(const std::string& path) {
  std::ifstream file(path, std::ios::binary);
  return std::string(std::istreambuf_iterator<char>(file), {});
}

}  // namespace

int main(int argc, char** argv) try {
  if (argc != 4) return 2;
  const std::string folder = argv[2];
  const auto commands = tools::cli::describeCommands();
  write(folder + "/ktorba.1", tools::cli::makeManPage(commands, argv[1]));
  write(folder + "/ktorba.bash", tools::cli::makeBashCompletion(commands));
  write(folder + "/ktorba-script.7", tools::cli::makeScriptPage(read(argv[3]), argv[1]));
  write(folder + "/ktorba.fish", tools::cli::makeFishCompletion(commands));
  write(folder + "/_ktorba", tools::cli::makeZshCompletion(commands));
  return 0;
} catch (const std::exception& error) {
  std::fprintf(stderr, "%s\n", error.what());
  return 1;
}
