// A file that appears under its name only when it is whole: written to a temporary name beside the final one and
// renamed by commit(). When it is destroyed before that, by a full disk say, nothing stays and a file that had the
// name keeps its content.
#pragma once

#include <cstddef>
#include <cstdio>
#include <string>

namespace tools {

class AtomicFile {
 public:
  // Throws Refusal when no file can be made there, or when `path` is a directory.
  explicit AtomicFile(const std::string& path);
  ~AtomicFile();
  AtomicFile(const AtomicFile&) = delete;
  AtomicFile& operator=(const AtomicFile&) = delete;

  const std::string& path() const { return path_; }
  std::FILE* stream() const { return stream_; }  // for reading, writing and seeking; owned by this object

  void write(const void* bytes, std::size_t count);  // throws Refusal when they could not all be written
  void commit();                                     // throws Refusal; call it once, last

 private:
  [[noreturn]] void fail() const;

  std::string path_;
  std::string temporaryPath_;
  std::FILE* stream_;
};

}  // namespace tools
