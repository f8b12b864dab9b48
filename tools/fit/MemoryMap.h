// Where waveforms lie in a generator's sample memory, and what is free between them. A value; any thread may read it.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace tools {

// Of whole memory words.
struct MappedBlock {
  std::string waveform;  // empty: a hole
  std::uint64_t firstByte = 0;
  std::uint64_t bytes = 0;
  std::uint64_t samples = 0;  // of the waveform, or for which the hole has room

  bool isHole() const { return waveform.empty(); }
};

// By how much a waveform could be longer while all others stay where they are: it would be placed anew.
struct Extension {
  std::string waveform;
  std::uint64_t samples = 0;
};

class MemoryMap {
 public:
  // `waveforms` in any order; each lies on whole words, and none on another.
  MemoryMap(std::vector<MappedBlock> waveforms, std::uint64_t memoryBytes, std::uint32_t wordBytes,
            std::uint32_t sampleBytes);

  const std::vector<MappedBlock>& blocks() const { return blocks_; }  // ascending, without gaps
  std::uint64_t memoryBytes() const { return memoryBytes_; }
  std::uint64_t usedBytes() const { return memoryBytes_ - freeBytes_ - unusableBytes(); }
  // Behind the last whole word.
  std::uint64_t unusableBytes() const { return memoryBytes_ % wordBytes_; }

  std::uint64_t holeCount() const { return holeCount_; }
  std::uint64_t freeBytes() const { return freeBytes_; }  // of all holes
  std::uint64_t largestHoleBytes() const { return largestHoleBytes_; }
  std::uint64_t largestHoleSamples() const { return largestHoleBytes_ / sampleBytes_; }
  // The share of the free bytes that lie outside the largest hole: 0 where they are all in one, or none is free.
  double fragmentation() const;

  // Of the longest waveform, the first of equals; nothing where there is none.
  std::optional<Extension> longest() const;

 private:
  void append(MappedBlock block);
  std::uint64_t holeBytesAt(std::size_t index) const;

  std::uint64_t memoryBytes_;
  std::uint32_t wordBytes_;
  std::uint32_t sampleBytes_;
  std::vector<MappedBlock> blocks_;
  std::uint64_t holeCount_ = 0;
  std::uint64_t freeBytes_ = 0;
  std::uint64_t largestHoleBytes_ = 0;
};

}  // namespace tools
