#include "platform/system/LazyMemory.h"

#include <windows.h>

#include <new>
#include <utility>

namespace platform {

LazyMemory::LazyMemory(std::size_t bytes) : size_(bytes) {
  if (bytes == 0) return;
  data_ = static_cast<std::byte*>(VirtualAlloc(nullptr, bytes, MEM_RESERVE | MEM_COMMIT, PAGE_READWRITE));
  if (data_ == nullptr) throw std::bad_alloc();
}

LazyMemory::~LazyMemory() {
  if (data_ != nullptr) VirtualFree(data_, 0, MEM_RELEASE);
}

LazyMemory::LazyMemory(LazyMemory&& other) noexcept
    : data_(std::exchange(other.data_, nullptr)), size_(std::exchange(other.size_, 0)) {}

LazyMemory& LazyMemory::operator=(LazyMemory&& other) noexcept {
  std::swap(data_, other.data_);
  std::swap(size_, other.size_);
  return *this;
}

}  // namespace platform
