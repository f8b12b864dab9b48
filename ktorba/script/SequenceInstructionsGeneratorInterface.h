// Encodes resolved instructions into words. Every encoder overwrites all of `words` and returns the number of
// sample-memory words that the instruction reads (0 for those that read none). A value too large for its field is cut
// to the field's lowest bits (ktorba/script/instructionFormat.h). One thread at a time.
//
// While a sample has fewer than 8 bits or a memory word holds no sample, encoding anything that reads memory raises
// ktorba_errors::kErrorInternalSWError with a message that names the trait.
#pragma once

#include <cstdint>

#include "conventions/conventions.h"
#include "ktorba/script/SequenceInstructionWords.h"

namespace ktorba {

using nSequenceInstruction::SequenceInstructionWords;

struct FetchDescriptor {
  std::uint32_t sampleCount = 0;
  std::uint32_t waveformAddress = 0;  // byte address in sample memory of the waveform's first sample; 0 for a wait
  std::uint32_t startOffset = 0;      // samples from there to the first sample emitted
  std::uint32_t markerOffset = 0;     // samples from the first emitted sample to the marker; bits 7..0 are encoded
  std::uint8_t markerMask = 0;        // bit n: marker n fires at markerOffset
  std::uint8_t clearFlag = 0;         // bit h-1: clears hardware trigger h
  std::uint32_t triggerNumber = 0;    // hardware trigger 1..8 that a wait ends on, 0 none; bits 3..0 are encoded
  std::uint8_t isWait = 0;
  std::uint8_t isFinal = 0;  // only in the script-end instruction
};

struct LoopDescriptor {
  LoopKind loopKind = LoopKind::kCounted;
  std::uint32_t iterationCount = 0;
  std::uint32_t triggerNumber = 0;  // hardware trigger 1..8 of an until-loop, else 0
  std::uint8_t clearFlag = 0;       // as in FetchDescriptor
};

// Where a fetch lies in sample memory: the whole memory words it reads and the samples it drops at both ends. With
// `Samples` and `Skip` of 64 bits every value is exact; the encoder computes in 32 and 8 bits, as the words hold them.
template <typename Samples, typename Skip>
struct FetchGeometry {
  Samples firstSample = 0;  // from the start of sample memory
  Samples span = 0;         // samples from the start of the first word to behind the last sample emitted
  Samples firstWord = 0;    // memory words from the start of sample memory
  Samples wordCount = 0;    // memory words
  Skip headSkip = 0;        // samples of the first word
  Skip tailSkip = 0;        // samples of the last word
};
using ExactFetchGeometry = FetchGeometry<std::uint64_t, std::uint64_t>;

class SequenceInstructionsGeneratorInterface {
 public:
  virtual ~SequenceInstructionsGeneratorInterface() = default;

  // The instruction that opens every script: a wait of the shortest fetch's length, for the start trigger.
  virtual std::uint32_t encodeScriptStart(SequenceInstructionWords& words) = 0;

  // The one that ends a script which has an end: such a wait for nothing.
  virtual std::uint32_t encodeScriptEnd(SequenceInstructionWords& words) = 0;

  // A fetch of samples, or a wait.
  virtual std::uint32_t encodeFetch(const FetchDescriptor& fetch, SequenceInstructionWords& words) = 0;

  // A jump to the instruction at `targetAddress`, its index in the program.
  virtual std::uint32_t encodeJump(std::uint32_t targetAddress, SequenceInstructionWords& words) = 0;

  // The two ends of a loop, which get the same arguments; `bodyAddress` is that of the instruction behind the first.
  virtual std::uint32_t encodeLoopStart(std::uint32_t bodyAddress, const LoopDescriptor& loop,
                                        SequenceInstructionWords& words) = 0;
  virtual std::uint32_t encodeLoopEnd(std::uint32_t bodyAddress, const LoopDescriptor& loop,
                                      SequenceInstructionWords& words) = 0;

  // What encodeFetch() would have to write for `fetch`, uncut: lets the caller refuse what does not fit. An encoder
  // that does not tell gives a geometry that always fits.
  virtual ExactFetchGeometry measureFetch(const FetchDescriptor&) const { return {.wordCount = 1}; }
};

}  // namespace ktorba
