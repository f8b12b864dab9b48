#include "tools/outputs/OutputFile.h"

#include <array>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <random>
#include <utility>

#include "platform/system/files.h"
#include "platform/system/interrupts.h"
#include "platform/system/paths.h"
#include "platform/system/terminal.h"
#include "tools/text/Refusal.h"

namespace tools {
namespace {

namespace fs = std::filesystem;

constexpr int kMostLinks = 40;  // as systems have it

std::string temporaryName(const std::string& path) {
  return path + "." + std::to_string(std::random_device()()) + ".part";
}

// The last of a chain of symbolic links, whether there is a file or not.
fs::path followLinks(fs::path path) {
  std::error_code error;
  for (int links = 0; links < kMostLinks && fs::is_symlink(path, error); ++links) {
    path = path.parent_path() / fs::read_symlink(path, error);
  }
  return path;
}

bool mayBeWritten(const fs::path& path) {
  constexpr fs::perms kWriters = fs::perms::owner_write | fs::perms::group_write | fs::perms::others_write;
  std::error_code ignored;
  if ((fs::status(path, ignored).permissions() & kWriters) == fs::perms::none) return false;
  std::FILE* const file = platform::openFile(platform::toText(path), "r+b");
  return file != nullptr && std::fclose(file) == 0;
}

bool isStream(const std::string& path) {
  std::error_code ignored;
  return isStandardOutput(path) || fs::is_other(fs::status(platform::toPath(path), ignored));
}

}  // namespace

bool isStandardOutput(const std::string& path) { return path == kStandardOutput || platform::isStandardOutput(path); }

void checkPlace(const std::string& path) {
  if (isStream(path)) return;
  std::error_code ignored;
  const fs::path file = followLinks(platform::toPath(path));
  const fs::path folder = file.parent_path();
  if (!folder.empty() && !fs::is_directory(folder, ignored)) {
    throw Refusal(path + ": there is no folder " + platform::toText(folder));
  }
  if (fs::is_directory(file, ignored)) throw Refusal(path + ": is a directory");
  if (fs::exists(file, ignored) && !mayBeWritten(file)) {
    throw Refusal(path + ": is there already and may not be written", "Remove it, or make it writable.");
  }
}

std::optional<std::string> folderOf(const std::string& path) {
  if (isStream(path)) return std::nullopt;
  return platform::toText(followLinks(platform::toPath(path)).parent_path());
}

OutputFile::OutputFile(const std::string& path, bool needsSeeking)
    : path_(path), finalPath_(platform::toText(followLinks(platform::toPath(path)))) {
  checkPlace(path);
  isStream(path) ? openStream(needsSeeking) : openPart();
}

OutputFile::~OutputFile() {
  if (stream_ != nullptr && stream_ != stdout) std::fclose(stream_);
  if (destination_ != nullptr && destination_ != stdout) std::fclose(destination_);
  if (partPath_.empty()) return;
  std::error_code ignored;
  fs::remove(platform::toPath(partPath_), ignored);
  platform::keepOnInterrupt(partPath_);
}

void OutputFile::openStream(bool needsSeeking) {
  std::FILE* const stream = isStandardOutput(path_) ? stdout : platform::openFile(path_, "wb");
  (needsSeeking ? destination_ : stream_) = stream;
  if (stream != nullptr && needsSeeking) stream_ = platform::makeTemporaryFile();
  if (stream_ == nullptr) fail();
}

void OutputFile::openPart() {
  partPath_ = temporaryName(finalPath_);
  platform::removeOnInterrupt(partPath_);
  stream_ = platform::createNewFile(partPath_);
  if (stream_ == nullptr) fail();
  std::error_code ignored;
  isCopied_ = fs::exists(platform::toPath(finalPath_), ignored) && !platform::takeOwnerAndMode(stream_, finalPath_);
}

std::size_t OutputFile::tryWrite(const void* bytes, std::size_t count) {
  const std::size_t written = std::fwrite(bytes, 1, count, stream_);
  if (written != count) noteError();
  return written;
}

// A seek writes what waits, so that it can fail as writing does.
std::int64_t OutputFile::trySeek(std::int64_t offset, int whence) {
  const std::int64_t position = platform::seekFile(stream_, offset, whence);
  if (position < 0) noteError();
  return position;
}

void OutputFile::flush() {
  if (std::fflush(stream_) != 0) fail();
}

void OutputFile::commit() {
  if (isCopied_) destination_ = platform::openFile(finalPath_, "wb");
  if (isCopied_ && destination_ == nullptr) fail();
  if (destination_ != nullptr) copyTo(destination_);
  close(stream_);
  close(destination_);
  if (partPath_.empty() || isCopied_) return;
  std::error_code error;
  fs::rename(platform::toPath(partPath_), platform::toPath(finalPath_), error);
  if (error) throw Refusal(path_ + ": " + error.message());
}

void OutputFile::copyTo(std::FILE* destination) {
  if (std::fflush(stream_) != 0 || platform::seekFile(stream_, 0, SEEK_SET) != 0) fail();
  std::array<char, 65536> block;
  while (const std::size_t count = std::fread(block.data(), 1, block.size(), stream_)) {
    if (std::fwrite(block.data(), 1, count, destination) != count) fail();
  }
  if (std::ferror(stream_) != 0) fail();
}

void OutputFile::close(std::FILE*& stream) {
  if (stream == nullptr) return;
  std::FILE* const closed = std::exchange(stream, nullptr);
  const bool hadError = error_ != 0 || std::ferror(closed) != 0;
  if ((closed == stdout ? std::fflush(closed) : std::fclose(closed)) != 0 || hadError) fail();
}

void OutputFile::noteError() {
  if (error_ == 0) error_ = errno;
}

void OutputFile::fail() {
  noteError();
  errno = error_;
  if (platform::wasPipeClosed()) throw ReaderGone(path_);
  throw Refusal(path_ + ": cannot be written: " + std::strerror(error_));
}

}  // namespace tools
