#include "ktWfmScriptCompiler/Arena.h"

#include <algorithm>

namespace ktwfmscriptcompiler {

void Arena::addChunk(std::size_t least) {
  const std::size_t size = std::max(nextChunk_, least);
  chunks_.push_back(std::make_unique_for_overwrite<std::byte[]>(size));
  next_ = chunks_.back().get();
  end_ = next_ + size;
  nextChunk_ = std::min(2 * nextChunk_, kLargestChunk);
}

}  // namespace ktwfmscriptcompiler
