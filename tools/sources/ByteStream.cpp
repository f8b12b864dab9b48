#include "tools/sources/ByteStream.h"

#include <fstream>

#include "platform/system/paths.h"
#include "tools/text/Refusal.h"

namespace tools {
namespace {

class FileStream : public ByteStream {
 public:
  FileStream(const std::string& source, const std::string& path)
      : source_(source), stream_(platform::toPath(path), std::ios::binary) {
    stream_.seekg(0, std::ios::end);
    const auto end = stream_.tellg();
    stream_.seekg(0);
    if (!stream_ || end < 0) throw Refusal(source + ": cannot be opened for reading");
    size_ = static_cast<std::uint64_t>(end);
  }

  std::size_t read(char* bytes, std::size_t count) override {
    stream_.read(bytes, static_cast<std::streamsize>(count));
    if (stream_.bad()) throw Refusal(source_ + ": cannot be read");
    return static_cast<std::size_t>(stream_.gcount());
  }

  std::uint64_t size() const override { return size_; }

 private:
  const std::string& source_;
  std::ifstream stream_;
  std::uint64_t size_ = 0;
};

}  // namespace

std::unique_ptr<ByteStream> openFile(const std::string& source, const std::string& path) {
  return std::make_unique<FileStream>(source, path);
}

}  // namespace tools
