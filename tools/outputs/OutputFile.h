// Where an output goes. A file appears under its name only when it is whole: it is written to a temporary name beside
// the final one, which commit() gives it. When the object is destroyed before that, by a full disk say, or the program
// interrupted, nothing stays and a file that had the name keeps its content. A file that is there keeps its mode and
// its owner, and a symbolic link stays one. What is no file, a pipe or a device, is written as a stream. One thread.
#pragma once

#include <cstdio>
#include <optional>
#include <stdexcept>
#include <string>

#include "tools/outputs/ByteTarget.h"

namespace tools {

// The path that means the standard output.
inline constexpr char kStandardOutput[] = "-";

bool isStandardOutput(const std::string& path);

// Throws Refusal when `path` is a directory, lies in none, or is a file that nobody may write.
void checkPlace(const std::string& path);

// Nobody reads the stream any more: there is nothing to be done and nothing wrong.
class ReaderGone : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

// The folder of the file at `path`, behind symbolic links; nothing for a stream, which no disk has to hold.
std::optional<std::string> folderOf(const std::string& path);

// Every function throws Refusal when what it writes does not go where it should, and ReaderGone.
class OutputFile : public ByteTarget {
 public:
  // `needsSeeking`: a stream is then written to a temporary file first.
  explicit OutputFile(const std::string& path, bool needsSeeking = false);
  ~OutputFile() override;
  OutputFile(const OutputFile&) = delete;
  OutputFile& operator=(const OutputFile&) = delete;

  const std::string& path() const override { return path_; }
  std::size_t tryWrite(const void* bytes, std::size_t count) override;
  std::int64_t trySeek(std::int64_t offset, int whence) override;
  bool hasFailed() const override { return error_ != 0; }
  [[noreturn]] void fail() override;

  void flush();   // what waits to be written
  void commit();  // call it once, last

 private:
  void openStream(bool needsSeeking);
  void openPart();
  void copyTo(std::FILE* destination);
  void close(std::FILE*& stream);
  void noteError();

  std::string path_;       // as it was given
  std::string finalPath_;  // behind symbolic links
  std::string partPath_;   // empty for streams
  std::FILE* stream_ = nullptr;
  std::FILE* destination_ = nullptr;  // of what was written to a temporary file first
  bool isCopied_ = false;             // into the file that is there, which alone has its owner
  int error_ = 0;                     // the first; 0 while there is none
};

}  // namespace tools
