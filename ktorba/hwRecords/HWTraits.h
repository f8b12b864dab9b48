// The constants of one generator, read from its registers (ktorba/commandControl) and copied by value to every part
// that needs them. A fresh record is all zero.
#pragma once

#include <cstdint>

namespace ktorba {

struct HWTraits {
  std::uint8_t downloadFifoNumber = 0;    // number of the generator's download DMA FIFO
  std::uint8_t minFetchSamplesByte = 0;   // same value as minFetchSamples
  std::uint16_t memoryWordBits = 0;       // width of one sample-memory word
  std::uint32_t memorySizeBytes = 0;      // sample memory
  std::uint32_t sequenceMemoryWords = 0;  // capacity of sequence memory, 128-bit instruction words
  std::uint16_t maxPrimingWords = 0;      // largest priming depth, memory words
  std::uint8_t sampleWidthBits = 0;       // 16 or 32 on the generators there are; never 0 after a read
  std::uint32_t downloadElementBits = 0;  // width of one download element
  std::uint32_t waveformMemorySize = 0;   // memorySizeBytes / ((memoryWordBits + 8) / 8): what hosts are told
  std::uint32_t samplesPerMemoryWord = 0;
  std::uint32_t minFetchSamples = 0;   // shortest waveform, subset and marker distance, samples
  std::uint32_t alignmentQuantum = 0;  // lengths and positions are multiples of it; 1 after a read
  std::uint32_t auxiliarySize = 0;     // carried along; no operation interprets it
  bool hasStreamingRegisters = false;

  std::uint32_t sampleBytes() const { return sampleWidthBits >> 3; }
  std::uint32_t memoryWordBytes() const { return memoryWordBits >> 3; }
};

// Fills the fields that follow from those that registers give; `sampleWidthBits` must not be 0.
inline void deriveTraits(HWTraits& traits) {
  traits.alignmentQuantum = 1;
  traits.waveformMemorySize = traits.memorySizeBytes / ((traits.memoryWordBits + 8u) / 8u);
  traits.samplesPerMemoryWord = traits.memoryWordBits / std::uint32_t{traits.sampleWidthBits};
  traits.minFetchSamples = traits.minFetchSamplesByte;
}

}  // namespace ktorba
