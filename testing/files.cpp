#include "testing/files.h"

#include <fstream>
#include <random>
#include <set>
#include <sstream>

std::string readFile(const std::filesystem::path& path) {
  std::ostringstream text;
  text << std::ifstream(path, std::ios::binary).rdbuf();
  return text.str();
}

// Tests run at the same time in several processes: a name that is taken is another one's.
TemporaryFolder::TemporaryFolder() {
  std::random_device random;
  do {
    path_ = std::filesystem::temp_directory_path() / ("ktorba-test-" + std::to_string(random()));
  } while (!std::filesystem::create_directory(path_));
}

TemporaryFolder::~TemporaryFolder() { std::filesystem::remove_all(path_); }

std::string TemporaryFolder::write(const std::string& name, const std::string& content) const {
  std::ofstream(path(name), std::ios::binary) << content;
  return path(name);
}

std::string TemporaryFolder::list() const {
  std::set<std::string> names;
  for (const auto& entry : std::filesystem::directory_iterator(path_)) names.insert(entry.path().filename().string());
  std::string text;
  for (const std::string& name : names) text += name + " ";
  return text;
}
