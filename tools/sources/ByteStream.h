// The bytes of a file, or of one file within an archive, from front to back. One thread at a time.
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

struct zip;

namespace tools {

class ByteStream {
 public:
  virtual ~ByteStream() = default;

  // Reads up to `count` bytes; fewer only at the end. Throws Refusal.
  virtual std::size_t read(char* bytes, std::size_t count) = 0;
  // All that the stream says to hold; read() may find that it holds fewer.
  virtual std::uint64_t size() const = 0;
};

// `source` is named in messages and outlives the stream. Throws Refusal.
std::unique_ptr<ByteStream> openFile(const std::string& source, const std::string& path);

// A zip archive, for reading.
class Archive {
 public:
  Archive(const std::string& source, const std::string& path);

  // The names of its files, in its order.
  std::vector<std::string> names() const;
  // The file of that place in names(). The archive outlives the stream.
  std::unique_ptr<ByteStream> open(std::size_t index) const;

 private:
  const std::string& source_;
  std::shared_ptr<zip> zip_;
};

}  // namespace tools
