// Files of tests.
#pragma once

#include <filesystem>
#include <string>

// All bytes of the file; none where there is no such file.
std::string readFile(const std::filesystem::path& path);

// A folder of its own for one test, removed with the object.
class TemporaryFolder {
 public:
  TemporaryFolder();
  ~TemporaryFolder();
  TemporaryFolder(const TemporaryFolder&) = delete;
  TemporaryFolder& operator=(const TemporaryFolder&) = delete;

  std::string path(const std::string& name) const { return (path_ / name).string(); }
  std::string read(const std::string& name) const { return readFile(path(name)); }

  // Returns the path.
  std::string write(const std::string& name, const std::string& content) const;

  // The names of all files in it, sorted, each with a blank behind it.
  std::string list() const;

 private:
  std::filesystem::path path_;
};
