// Writes man page and completions into a folder, while the tool is built:  ktorba_documents VERSION FOLDER
#include <cstdio>
#include <string>

#include "cli/documents.h"
#include "tools/outputs/OutputFile.h"

namespace {

void write(const std::string& path, const std::string& text) {
  tools::OutputFile file(path);
  file.write(text.data(), text.size());
  file.commit();
}

}  // namespace

int main(int argc, char** argv) try {
  if (argc != 3) return 2;
  const std::string folder = argv[2];
  const auto commands = tools::cli::describeCommands();
  write(folder + "/ktorba.1", tools::cli::makeManPage(commands, argv[1]));
  write(folder + "/ktorba.bash", tools::cli::makeBashCompletion(commands));
  write(folder + "/_ktorba", tools::cli::makeZshCompletion(commands));
  return 0;
} catch (const std::exception& error) {
  std::fprintf(stderr, "%s\n", error.what());
  return 1;
}
