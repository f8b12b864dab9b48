// A folder of its own for one test, removed with the object.
#pragma once

#include <filesystem>
#include <fstream>
#include <set>
#include <sstream>
#include <string>

class TemporaryFolder {
 public:
  TemporaryFolder() {
    static int count = 0;
    path_ = std::filesystem::temp_directory_path() /
            ("ktorba-test-" + std::to_string(reinterpret_cast<std::uintptr_t>(this)) + "-" + std::to_string(count++));
    std::filesystem::remove_all(path_);
    std::filesystem::create_directories(path_);
  }
  ~TemporaryFolder() { std::filesystem::remove_all(path_); }

  std::string path(const std::string& name) const { return (path_ / name).string(); }
  std::string write(const std::string& name, const std::string& content) const {
    std::ofstream(path(name), std::ios::binary) << content;
    return path(name);
  }
  std::string read(const std::string& name) const {
    std::ostringstream text;
    text << std::ifstream(path(name), std::ios::binary).rdbuf();
    return text.str();
  }
  // The names of all files in it, sorted, each with a blank behind it.
  std::string list() const {
    std::set<std::string> names;
    for (const auto& entry : std::filesystem::directory_iterator(path_)) names.insert(entry.path().filename().string());
    std::string text;
    for (const std::string& name : names) text += name + " ";
    return text;
  }

 private:
  std::filesystem::path path_;
};
