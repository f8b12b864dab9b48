// The rules by which a generator's sample memory takes waveforms: what a name and a length must be, how much memory a
// waveform gets, and that table and allocator change together or not at all. One thread at a time.
#pragma once

#include <string>

#include "ktorba/hwRecords/HWTraits.h"
#include "ktorba/waveform/MemoryBlockManagerInterface.h"
#include "ktorba/waveform/WaveformTableInterface.h"

namespace ktorba {

class WaveformStore {
 public:
  // Borrows all three for its life. The traits must be workable, the memory's granularity is one of its words.
  WaveformStore(const HWTraits& traits, WaveformTableInterface& table, MemoryBlockManagerInterface& memory)
      : traits_(traits), table_(table), memory_(memory) {}

  // Adds a waveform of `numSamples` samples with a block of whole memory words, at write position 0. Raises, in this
  // order, ktorba_errors::kErrorWaveformNameIsEmpty, the errors of ktcheckname::checkName(),
  // kErrorWaveformNameAlreadyExists, kErrorNumSamplesInWaveformMustBeGreaterThanZero,
  // kErrorRequestedWaveformLengthIsTooSmall, kErrorNumSamplesToAllocateIsNotMultipleOfAlignmentQuantum,
  // kErrorTotalWaveformSizeExceedAllocatedSizeInFPGA; then nothing has changed.
  WaveformEntry& allocate(const std::string& name, std::uint32_t numSamples);

  // Gives a waveform's name and block up. Raises kErrorSpecifiedWaveformNotFound.
  void clear(const std::string& name);

  void clearAll();

  // Bytes of the block that `numSamples` samples take: whole memory words.
  std::uint64_t blockBytes(std::uint32_t numSamples) const;

  // Samples of the longest waveform that can still be allocated.
  std::uint32_t largestLength() const { return memory_.getLargestAvailableBlockSize() / traits_.sampleBytes(); }

 private:
  void checkNew(const std::string& name, std::uint32_t numSamples) const;
  // blockBytes(); raises when no free block is that large.
  std::uint32_t blockSize(std::uint32_t numSamples) const;

  const HWTraits& traits_;
  WaveformTableInterface& table_;
  MemoryBlockManagerInterface& memory_;
};

}  // namespace ktorba
