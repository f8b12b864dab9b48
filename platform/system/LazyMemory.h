// Zeroed memory that costs nothing before it is touched: pages are backed by the system at their first write. For
// buffers whose size is a limit rather than a need. One owner; threads as for any plain memory.
#pragma once

#include <cstddef>

namespace platform {

class LazyMemory {
 public:
  LazyMemory() = default;
  // Throws std::bad_alloc when the system has no such address range; uses no heap.
  explicit LazyMemory(std::size_t bytes);
  ~LazyMemory();
  LazyMemory(LazyMemory&& other) noexcept;
  LazyMemory& operator=(LazyMemory&& other) noexcept;

  std::byte* data() const { return data_; }  // page aligned; null when size() is 0
  std::size_t size() const { return size_; }

 private:
  std::byte* data_ = nullptr;
  std::size_t size_ = 0;
};

}  // namespace platform
