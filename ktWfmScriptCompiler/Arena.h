// Memory for the nodes of one parse tree or the records of one script: handed out in order, freed all at once, with no
// destructor run. One thread at a time hands out; any number may read what it got.
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <span>
#include <string_view>
#include <type_traits>
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

  // Creates as many items, one behind the other.
  template <typename Item>
  std::span<Item> create(std::size_t count) {
    static_assert(alignof(Item) <= kAlignment && std::is_trivially_destructible_v<Item>);
    auto* const items = static_cast<Item*>(allocate(count * sizeof(Item)));
    std::uninitialized_value_construct_n(items, count);
    return {items, count};
  }

  // Copies a text or a sequence of numbers.
  std::string_view store(std::string_view text) { return {storeItems(text.data(), text.size()), text.size()}; }
  std::span<const std::uint32_t> store(std::span<const std::uint32_t> numbers) {
    return {storeItems(numbers.data(), numbers.size()), numbers.size()};
  }

 private:
  static constexpr std::size_t kFirstChunk = 256;  // enough for a short script
  // Small enough for the C library to keep freed chunks for the next ones: fresh pages cost a large script more than
  // anything that is done with them.
  static constexpr std::size_t kLargestChunk = 32768;

  template <typename Item>
  const Item* storeItems(const Item* items, std::size_t count) {
    auto* const copy = static_cast<Item*>(allocate(count * sizeof(Item)));
    std::uninitialized_copy_n(items, count, copy);
    return copy;
  }

  void addChunk(std::size_t least);

  std::vector<std::unique_ptr<std::byte[]>> chunks_;
  std::byte* next_ = nullptr;  // first free byte of the last chunk
  std::byte* end_ = nullptr;
  std::size_t nextChunk_ = kFirstChunk;  // bytes; doubles up to kLargestChunk
};

}  // namespace ktwfmscriptcompiler
