// Where the bytes of an output go. One thread.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

namespace tools {

class ByteTarget {
 public:
  virtual ~ByteTarget() = default;

  virtual const std::string& path() const = 0;  // as the user gave it

  // How many bytes went out. For those between whom and here no exception may pass: fewer than `count` are noted, and
  // fail() tells why.
  virtual std::size_t tryWrite(const void* bytes, std::size_t count) = 0;
  // As std::fseek, where the target was made for it. The position after it; -1, noted likewise, when it fails.
  virtual std::int64_t trySeek(std::int64_t offset, int whence) = 0;

  virtual bool hasFailed() const = 0;
  [[noreturn]] virtual void fail() = 0;  // throws what the target throws for its first failure

  void write(const void* bytes, std::size_t count) {
    if (tryWrite(bytes, count) != count) fail();
  }
};

}  // namespace tools
