#include "ktorba/script/SequenceInstructionsGenerator.h"

#include <bit>

#include "conventions/conventions.h"
#include "kterr/Failure.h"

namespace ktorba {
namespace {

constexpr char kSource[] = R"(ktorba\script\SequenceInstructionsGenerator)";

// A quotient by one of the traits. They are powers of two on all common hardware, which spares each fetch six
// divisions.
template <typename Samples>
Samples quotient(Samples value, std::uint32_t divisor) {
  const bool isPowerOfTwo = (divisor & (divisor - 1)) == 0;
  return isPowerOfTwo ? value >> std::countr_zero(divisor) : value / divisor;
}

template <typename Samples, typename Skip>
FetchGeometry<Samples, Skip> geometryOf(const FetchDescriptor& fetch, const HWTraits& traits) {
  const std::uint32_t samplesPerWord = traits.samplesPerMemoryWord;
  FetchGeometry<Samples, Skip> geometry;
  geometry.firstSample = quotient<Samples>(fetch.waveformAddress, traits.sampleBytes()) + fetch.startOffset;
  geometry.firstWord = quotient(geometry.firstSample, samplesPerWord);
  geometry.headSkip = static_cast<Skip>(geometry.firstSample - geometry.firstWord * samplesPerWord);
  geometry.span = geometry.headSkip + Samples{fetch.sampleCount};
  geometry.wordCount = quotient(geometry.span, samplesPerWord);
  const Skip tail = static_cast<Skip>(geometry.span - geometry.wordCount * samplesPerWord);
  if (tail != 0) {
    ++geometry.wordCount;
    geometry.tailSkip = static_cast<Skip>(samplesPerWord - tail);
  }
  return geometry;
}

SequenceInstructionWords blank(Opcode opcode) {
  SequenceInstructionWords words;
  writeField(words, kOpcodeField, static_cast<std::uint32_t>(opcode));
  return words;
}

SequenceInstructionWords loopWords(Opcode opcode, std::uint32_t bodyAddress, const LoopDescriptor& loop) {
  SequenceInstructionWords words = blank(opcode);
  writeField(words, loop_field::kIterationCount, loop.iterationCount);
  writeField(words, loop_field::kBodyAddress, bodyAddress);
  writeField(words, loop_field::kTriggerNumber, loop.triggerNumber);
  writeField(words, loop_field::kIsUntil, loop.loopKind == LoopKind::kUntilTrigger);
  writeField(words, loop_field::kIsCounted, loop.loopKind == LoopKind::kCounted);
  writeField(words, loop_field::kClearFlag, loop.clearFlag);
  return words;
}

[[noreturn]] void refuseTrait(const char* text) {
  kterr::Failure(ktorba_errors::kErrorInternalSWError)
      .at(kSource)
      .message("ktorba::SequenceInstructionsGenerator", text)
      .raise();
}

}  // namespace

void SequenceInstructionsGenerator::receiveHWTraits(const HWTraits& traits) { traits_ = traits; }

std::uint32_t SequenceInstructionsGenerator::encodeScriptStart(SequenceInstructionWords& words) {
  FetchDescriptor wait;
  wait.sampleCount = traits_.minFetchSamples;
  wait.triggerNumber = kStartTrigger;
  wait.isWait = 1;
  return encodeRead(Opcode::kFetch, wait, words);
}

std::uint32_t SequenceInstructionsGenerator::encodeScriptEnd(SequenceInstructionWords& words) {
  FetchDescriptor wait;
  wait.sampleCount = traits_.minFetchSamples;
  wait.isWait = 1;
  wait.isFinal = 1;
  return encodeRead(Opcode::kScriptEnd, wait, words);
}

std::uint32_t SequenceInstructionsGenerator::encodeFetch(const FetchDescriptor& fetch,
                                                         SequenceInstructionWords& words) {
  return encodeRead(Opcode::kFetch, fetch, words);
}

std::uint32_t SequenceInstructionsGenerator::encodeJump(std::uint32_t targetAddress, SequenceInstructionWords& words) {
  words = blank(Opcode::kJump);
  writeField(words, jump_field::kTargetAddress, targetAddress);
  return 0;
}

std::uint32_t SequenceInstructionsGenerator::encodeLoopStart(std::uint32_t bodyAddress, const LoopDescriptor& loop,
                                                             SequenceInstructionWords& words) {
  words = loopWords(Opcode::kLoopStart, bodyAddress, loop);
  return 0;
}

std::uint32_t SequenceInstructionsGenerator::encodeLoopEnd(std::uint32_t bodyAddress, const LoopDescriptor& loop,
                                                           SequenceInstructionWords& words) {
  words = loopWords(Opcode::kLoopEnd, bodyAddress, loop);
  return 0;
}

ExactFetchGeometry SequenceInstructionsGenerator::measureFetch(const FetchDescriptor& fetch) const {
  checkTraits();
  return geometryOf<std::uint64_t, std::uint64_t>(fetch, traits_);
}

void SequenceInstructionsGenerator::checkTraits() const {
  if (traits_.sampleWidthBits < 8) refuseTrait("sampleWidthBits is below 8");
  if (traits_.samplesPerMemoryWord == 0) refuseTrait("samplesPerMemoryWord is 0");
}

std::uint32_t SequenceInstructionsGenerator::encodeRead(Opcode opcode, const FetchDescriptor& fetch,
                                                        SequenceInstructionWords& words) const {
  checkTraits();
  const auto geometry = geometryOf<std::uint32_t, std::uint8_t>(fetch, traits_);
  words = blank(opcode);
  writeField(words, fetch_field::kFirstWord, geometry.firstWord);
  writeField(words, fetch_field::kWordCount, geometry.wordCount);
  writeField(words, fetch_field::kHeadSkip, geometry.headSkip);
  writeField(words, fetch_field::kTailSkip, geometry.tailSkip);
  writeField(words, fetch_field::kMarkerMask, fetch.markerMask);
  writeField(words, fetch_field::kClearFlag, fetch.clearFlag);
  writeField(words, fetch_field::kTriggerNumber, fetch.triggerNumber);
  writeField(words, fetch_field::kIsWait, fetch.isWait != 0);
  writeField(words, fetch_field::kIsFinal, fetch.isFinal != 0);
  writeField(words, fetch_field::kMarkerOffset, fetch.markerOffset);
  return geometry.wordCount;
}

}  // namespace ktorba
