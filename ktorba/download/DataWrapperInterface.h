// Typed views over the caller's data, as the download path reads it: borrowed for the length of one call, in bytes.
#pragma once

#include <cstdint>

namespace ktorba {

class DataWrapperInterface {
 public:
  virtual ~DataWrapperInterface() = default;
  // Samples or instruction words in the view.
  virtual std::uint64_t getElementCount() const = 0;
  // Whether the data has to be copied into FIFO memory with copyTo() rather than sent from getPointer().
  virtual bool mustCopy() const = 0;
  virtual const std::uint8_t* getPointer(std::uint64_t byteOffset) const = 0;
  // Copies `byteCount` bytes that begin at `byteOffset` to `destination`.
  virtual void copyTo(std::uint8_t* destination, std::uint64_t byteOffset, std::uint64_t byteCount) const = 0;
};

// A view that owns nothing and never copies.
template <typename Element>
class DataWrapperNoCopy : public DataWrapperInterface {
 public:
  DataWrapperNoCopy(const Element* data, std::uint64_t elementCount) : data_(data), elementCount_(elementCount) {}

  std::uint64_t getElementCount() const override { return elementCount_; }
  bool mustCopy() const override { return false; }
  const std::uint8_t* getPointer(std::uint64_t byteOffset) const override {
    return reinterpret_cast<const std::uint8_t*>(data_) + byteOffset;
  }
  void copyTo(std::uint8_t*, std::uint64_t, std::uint64_t) const override {}

 private:
  const Element* data_;
  std::uint64_t elementCount_;
};

}  // namespace ktorba
