// Memory for the nodes of one parse tree: handed out in order, freed all at once. One thread at a time.
#pragma once

#include <cstddef>
#include <memory>
#include <vector>

namespace ktwfmscriptcompiler {

class Arena {
 public:
  static constexpr std::size_t kAlignment = alignof(void*);

  // Returns `size` bytes, aligned to kAlignment, that live as long as the arena. Throws std::bad_alloc.
  void* allocate(std::size_t size) {
    const std::size_t rounded = (size + kAlignment - 1) / kAlignment * kAlignment;
    if (rounded > static_cast<std::size_t>(end_ - next_)) addChunk(rounded);
    void* const place = next_;
    next_ += rounded;
    return place;
  }

 private:
  static constexpr std::size_t kFirstChunk = 4096;
  // Small enough for the C library to keep freed chunks, which then serve for the compiled script: fresh pages cost
  // a large script more than anything that is done with them.
  static constexpr std::size_t kLargestChunk = 32768;

  void addChunk(std::size_t least);

  std::vector<std::unique_ptr<std::byte[]>> chunks_;
  std::byte* next_ = nullptr;  // first free byte of the last chunk
  std::byte* end_ = nullptr;
  std::size_t nextChunk_ = kFirstChunk;  // bytes; doubles up to kLargestChunk
};

}  // namespace ktwfmscriptcompiler
