// The streaming waveform as the device sees it: a range of memory words that the host keeps rewriting while they are
// played. A mark per word says that it has been written and not yet played since; playing a word without its mark is
// an underflow, and words without it are the free space. Guarded by its FPGA's lock.
//
// Registers can only say up to which word the host has written, and say the same for no word and for one; one is
// taken, so that free space is never promised too large.
#pragma once

#include <cstdint>

#include "platform/system/LazyMemory.h"

namespace simulator {

class StreamingRange {
 public:
  StreamingRange() = default;
  StreamingRange(std::uint64_t memoryWords, std::uint32_t samplesPerWord);

  struct Pointer {
    bool isEnabled;
    std::uint64_t startWord;
    std::uint64_t endWord;
    std::uint64_t writtenUpToWord;  // outside the range: nothing is written
  };
  // Takes the registers over. While generation runs, the same range again changes nothing: the marks know better what
  // was played meanwhile.
  void load(const Pointer& pointer, bool isRunning);
  bool isLoaded() const { return isLoaded_; }
  std::uint64_t freeWords() const { return isLoaded_ ? endWord_ - startWord_ + 1 - marked_ : 0; }

  void written(std::uint64_t firstWord, std::uint64_t lastWord);
  // Samples are numbered from the start of the memory. A word counts as played with its last sample, or once another
  // word of the range or an earlier sample of its own is played. Returns false for an underflow.
  bool played(std::uint64_t firstSample, std::uint64_t count);
  void beginGeneration() { partEnd_ = kNone; }

 private:
  static constexpr std::uint64_t kNone = UINT64_MAX;

  std::uint64_t mark(std::uint64_t firstWord, std::uint64_t lastWord);
  std::uint64_t unmark(std::uint64_t firstWord, std::uint64_t lastWord);
  void endPart(std::uint64_t nextSample);
  bool isMarked(std::uint64_t word) const { return (bits()[word / 64] >> (word % 64) & 1) != 0; }
  std::uint64_t* bits() const { return reinterpret_cast<std::uint64_t*>(marks_.data()); }

  platform::LazyMemory marks_;  // a bit per word of the memory
  std::uint64_t memoryWords_ = 0;
  std::uint32_t samplesPerWord_ = 1;
  bool isLoaded_ = false;
  std::uint64_t startWord_ = 0;
  std::uint64_t endWord_ = 0;  // the last word itself
  std::uint64_t marked_ = 0;
  std::uint64_t partEnd_ = kNone;  // the sample behind those played of a word that is played in part
};

}  // namespace simulator
