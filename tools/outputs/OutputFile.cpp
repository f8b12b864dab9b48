#include "tools/outputs/AtomicFile.h"

#include <cerrno>
#include <cstring>
#include <filesystem>
#include <random>

#include "tools/text/Refusal.h"

namespace tools {
namespace {

std::string temporaryName(const std::string& path) {
  return path + "." + std::to_string(std::random_device()()) + ".part";
}

}  // namespace

AtomicFile::AtomicFile(const std::string& path) : path_(path), temporaryPath_(temporaryName(path)), stream_(nullptr) {
  std::error_code ignored;
  if (std::filesystem::is_directory(path, ignored)) throw Refusal(path + ": is a directory");
  stream_ = std::fopen(temporaryPath_.c_str(), "w+bx");
  if (stream_ == nullptr) fail();
}

AtomicFile::~AtomicFile() {
  if (stream_ != nullptr) std::fclose(stream_);
  std::error_code ignored;
  std::filesystem::remove(temporaryPath_, ignored);
}

void AtomicFile::write(const void* bytes, std::size_t count) {
  if (std::fwrite(bytes, 1, count, stream_) != count) fail();
}

void AtomicFile::commit() {
  std::FILE* const stream = stream_;
  const bool hadError = std::ferror(stream) != 0;
  stream_ = nullptr;
  if (std::fclose(stream) != 0 || hadError) fail();
  std::error_code error;
  std::filesystem::rename(temporaryPath_, path_, error);
  if (error) throw Refusal(path_ + ": " + error.message());
}

void AtomicFile::fail() const { throw Refusal(path_ + ": cannot be written: " + std::strerror(errno)); }

}  // namespace tools
