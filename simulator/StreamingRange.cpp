#include "simulator/StreamingRange.h"

#include <algorithm>
#include <bit>

namespace simulator {
namespace {

// Calls visit(index, mask) for every 64-bit group of the marks first to last.
template <typename Visit>
void forEachGroup(std::uint64_t first, std::uint64_t last, Visit visit) {
  for (std::uint64_t group = first / 64; group <= last / 64; ++group) {
    std::uint64_t mask = ~std::uint64_t{0};
    if (group == first / 64) mask &= ~std::uint64_t{0} << (first % 64);
    if (group == last / 64) mask &= ~std::uint64_t{0} >> (63 - last % 64);
    visit(group, mask);
  }
}

}  // namespace

StreamingRange::StreamingRange(std::uint64_t memoryWords, std::uint32_t samplesPerWord)
    : marks_((memoryWords / 64 + 1) * 8), memoryWords_(memoryWords), samplesPerWord_(samplesPerWord) {}

void StreamingRange::load(const Pointer& pointer, bool isRunning) {
  const bool isSameRange = isLoaded_ && startWord_ == pointer.startWord && endWord_ == pointer.endWord;
  if (isRunning && isSameRange && pointer.isEnabled) return;
  if (isLoaded_) unmark(startWord_, endWord_);
  isLoaded_ = pointer.isEnabled && pointer.startWord <= pointer.endWord && pointer.endWord < memoryWords_;
  startWord_ = pointer.startWord;
  endWord_ = pointer.endWord;
  marked_ = 0;
  partEnd_ = kNone;
  if (isLoaded_ && pointer.writtenUpToWord <= endWord_) written(startWord_, pointer.writtenUpToWord);
}

std::uint64_t StreamingRange::mark(std::uint64_t firstWord, std::uint64_t lastWord) {
  std::uint64_t changed = 0;
  forEachGroup(firstWord, lastWord, [&](std::uint64_t group, std::uint64_t mask) {
    changed += static_cast<std::uint64_t>(std::popcount(mask & ~bits()[group]));
    bits()[group] |= mask;
  });
  return changed;
}

std::uint64_t StreamingRange::unmark(std::uint64_t firstWord, std::uint64_t lastWord) {
  std::uint64_t changed = 0;
  forEachGroup(firstWord, lastWord, [&](std::uint64_t group, std::uint64_t mask) {
    changed += static_cast<std::uint64_t>(std::popcount(mask & bits()[group]));
    bits()[group] &= ~mask;
  });
  return changed;
}

void StreamingRange::written(std::uint64_t firstWord, std::uint64_t lastWord) {
  if (!isLoaded_) return;
  const std::uint64_t first = std::max(firstWord, startWord_);
  const std::uint64_t last = std::min(lastWord, endWord_);
  if (first > last) return;
  marked_ += mark(first, last);
  if (partEnd_ != kNone && first <= partEnd_ / samplesPerWord_ && partEnd_ / samplesPerWord_ <= last) partEnd_ = kNone;
}

// The word played in part counts as played, unless `nextSample` goes on in it.
void StreamingRange::endPart(std::uint64_t nextSample) {
  if (partEnd_ == kNone) return;
  const std::uint64_t word = partEnd_ / samplesPerWord_;
  const bool goesOn = nextSample >= partEnd_ && nextSample / samplesPerWord_ == word;
  if (!goesOn) marked_ -= unmark(word, word);
  partEnd_ = kNone;
}

bool StreamingRange::played(std::uint64_t firstSample, std::uint64_t count) {
  if (!isLoaded_) return true;
  const std::uint64_t endSample = firstSample + count;
  const std::uint64_t lastWord = (endSample - 1) / samplesPerWord_;
  const std::uint64_t first = std::max(firstSample / samplesPerWord_, startWord_);
  std::uint64_t last = std::min(lastWord, endWord_);
  if (first > last) return true;
  endPart(firstSample);
  bool wasWritten = true;
  if (last == lastWord && endSample % samplesPerWord_ != 0) {
    wasWritten = isMarked(last);
    partEnd_ = endSample;
    if (first == last) return wasWritten;
    --last;
  }
  const std::uint64_t unmarked = unmark(first, last);
  marked_ -= unmarked;
  return wasWritten && unmarked == last - first + 1;
}

}  // namespace simulator
