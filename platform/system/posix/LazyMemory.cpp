#include "platform/system/LazyMemory.h"

#include <sys/mman.h>

#include <new>
#include <utility>

namespace platform {

LazyMemory::LazyMemory(std::size_t bytes) : size_(bytes) {
  if (bytes == 0) return;
  void* const pages = mmap(nullptr, bytes, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS | MAP_NORESERVE, -1, 0);
  if (pages == MAP_FAILED) throw std::bad_alloc();
  data_ = static_cast<std::byte*>(pages);
}

LazyMemory::~LazyMemory() {
  if (data_ != nullptr) munmap(data_, size_);
}

LazyMemory::LazyMemory(LazyMemory&& other) noexcept
    : data_(std::exchange(other.data_, nullptr)), size_(std::exchange(other.size_, 0)) {}

LazyMemory& LazyMemory::operator=(LazyMemory&& other) noexcept {
  std::swap(data_, other.data_);
  std::swap(size_, other.size_);
  return *this;
}

}  // namespace platform
