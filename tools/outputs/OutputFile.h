// Where an output goes. A file appears under its name only when it is whole: it is written to a temporary name beside
// the final one, which commit() gives it. When the object is destroyed before that, by a full disk say, or the program
// interrupted, nothing stays and a file that had the name keeps its content. A file that is there keeps its mode and
// its owner, and a symbolic link stays one. What is no file, a pipe or a device, is written as a stream. One thread;
// one object at a time, since only one file can be removed on an interrupt.
#pragma once

#include <cstddef>
#include <cstdio>
#include <stdexcept>
#include <string>

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

// Every function throws Refusal when what it writes does not go where it should, and ReaderGone.
class OutputFile {
 public:
  // `needsSeeking`: a stream is then written to a temporary file first.
  explicit OutputFile(const std::string& path, bool needsSeeking = false);
  ~OutputFile();
  OutputFile(const OutputFile&) = delete;
  OutputFile& operator=(const OutputFile&) = delete;

  const std::string& path() const { return path_; }
  std::FILE* stream() const { return stream_; }  // for seeking where that was asked for; owned by this object

  void write(const void* bytes, std::size_t count);
  void commit();  // call it once, last

  // Remembers why the stream was not written, for those who write it by themselves.
  void noteError();
  bool hasError() const { return error_ != 0; }
  [[noreturn]] void fail();

 private:
  void openStream(bool needsSeeking);
  void openPart();
  void copyTo(std::FILE* destination);
  void close(std::FILE*& stream);

  std::string path_;       // as it was given
  std::string finalPath_;  // behind symbolic links
  std::string partPath_;   // empty for streams
  std::FILE* stream_ = nullptr;
  std::FILE* destination_ = nullptr;  // of what was written to a temporary file first
  bool isCopied_ = false;             // into the file that is there, which alone has its owner
  int error_ = 0;                     // the first; 0 while there is none
};

}  // namespace tools
