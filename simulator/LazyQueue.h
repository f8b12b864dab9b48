// A bounded first-in first-out queue of plain elements, contiguous in memory that is backed as it fills. Producers
// write at tail(), consumers read at head(). The memory holds twice the capacity, so that moving the waiting elements
// to its front costs less than the elements consumed since the last move.
#pragma once

#include <cstdint>
#include <cstring>
#include <limits>
#include <new>
#include <type_traits>

#include "platform/system/LazyMemory.h"

namespace simulator {

template <typename T>
class LazyQueue {
  static_assert(std::is_trivially_copyable_v<T>);

 public:
  LazyQueue() = default;
  // Throws std::bad_alloc when that much address space cannot be had.
  explicit LazyQueue(std::uint64_t capacity) : memory_(bytesFor(capacity)), capacity_(capacity) {}

  std::uint64_t capacity() const { return capacity_; }
  std::uint64_t size() const { return size_; }
  std::uint64_t room() const { return capacity_ - size_; }

  const T* head() const { return elements() + head_; }
  void consume(std::uint64_t count) {
    size_ -= count;
    head_ = size_ == 0 ? 0 : head_ + count;
  }

  // Where the next room() elements go. Valid until the next consume() or tail().
  T* tail() {
    if (head_ > capacity_) {
      std::memmove(elements(), head(), size_ * sizeof(T));
      head_ = 0;
    }
    return elements() + head_ + size_;
  }
  void produce(std::uint64_t count) { size_ += count; }

  void push(const T* source, std::uint64_t count) {
    if (count == 0) return;
    std::memcpy(tail(), source, count * sizeof(T));
    produce(count);
  }
  void clear() { head_ = size_ = 0; }

 private:
  static std::size_t bytesFor(std::uint64_t capacity) {
    if (capacity > std::numeric_limits<std::ptrdiff_t>::max() / (2 * sizeof(T))) throw std::bad_alloc();
    return static_cast<std::size_t>(2 * capacity * sizeof(T));
  }
  T* elements() const { return reinterpret_cast<T*>(memory_.data()); }

  platform::LazyMemory memory_;
  std::uint64_t capacity_ = 0;
  std::uint64_t head_ = 0;
  std::uint64_t size_ = 0;
};

}  // namespace simulator
