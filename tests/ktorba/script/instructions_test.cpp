#include <gtest/gtest.h>

#include <functional>

#include "kterr/ErrorConstant.h"
#include "ktorba/script/SequenceInstructionsGenerator.h"
#include "testing/caught.h"

namespace ktorba {
namespace {

SequenceInstructionsGenerator encoderFor(std::uint8_t sampleWidthBits, std::uint32_t samplesPerWord) {
  HWTraits traits;
  traits.sampleWidthBits = sampleWidthBits;
  traits.samplesPerMemoryWord = samplesPerWord;
  traits.minFetchSamples = 64;
  SequenceInstructionsGenerator encoder;
  encoder.receiveHWTraits(traits);
  return encoder;
}

using Words = std::array<std::uint32_t, 4>;

TEST(SequenceInstructionsGenerator, WritesTheKnownWords) {
  SequenceInstructionsGenerator encoder = encoderFor(16, 8);
  SequenceInstructionWords words;
  words.words = {~0u, ~0u, ~0u, ~0u};
  const FetchDescriptor fetch{.sampleCount = 10,
                              .waveformAddress = 64,
                              .startOffset = 3,
                              .markerOffset = 5,
                              .markerMask = 0x81,
                              .clearFlag = 0xC2,
                              .triggerNumber = 8};
  EXPECT_EQ(encoder.encodeFetch(fetch, words), 2u);
  EXPECT_EQ(words.words, (Words{4, 1, 0x08C28133, 0x10000014}));
  EXPECT_EQ(encoder.encodeScriptStart(words), 8u);
  EXPECT_EQ(words.words, (Words{0, 7, 0x01000000, 0x10000001}));
  EXPECT_EQ(encoder.encodeScriptEnd(words), 8u);
  EXPECT_EQ(words.words, (Words{0, 7, 0, 0x50000003}));
  EXPECT_EQ(encoder.encodeJump(1, words), 0u);
  EXPECT_EQ(words.words, (Words{1, 0, 0, 0x40000000}));
  EXPECT_EQ(encoder.encodeLoopStart(2, {LoopKind::kCounted, 5, 0, 0}, words), 0u);
  EXPECT_EQ(words.words, (Words{5, 2, 0x27, 0x20000000}));
  EXPECT_EQ(encoder.encodeLoopEnd(2, {LoopKind::kUntilTrigger, 1, 4, 0x82}, words), 0u);
  EXPECT_EQ(words.words, (Words{1, 2, 0x2093, 0x30000000}));
  EXPECT_EQ(encoder.encodeLoopEnd(9, {LoopKind::kForever, 1, 0, 0}, words), 0u);
  EXPECT_EQ(words.words, (Words{1, 9, 0x07, 0x30000000}));
}

TEST(SequenceInstructionsGenerator, RefusesTraitsItWouldDivideBy) {
  for (SequenceInstructionsGenerator encoder : {encoderFor(7, 8), encoderFor(16, 0)}) {
    SequenceInstructionWords words;
    for (const auto& encode : std::initializer_list<std::function<void()>>{
             [&] { encoder.encodeScriptStart(words); }, [&] { encoder.encodeScriptEnd(words); },
             [&] { encoder.encodeFetch({}, words); }, [&] { encoder.measureFetch({}); }}) {
      EXPECT_EQ(caught(encode).code(), ktorba_errors::kErrorInternalSWError.code);
    }
  }
}

}  // namespace
}  // namespace ktorba
