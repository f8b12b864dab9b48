#include <gmock/gmock.h>

#include "kterr/ErrorConstant.h"
#include "ktorba/script/SequenceInstructionsGenerator.h"
#include "ktorba/script/instructionDecoder.h"
#include "testing/caught.h"
#include "testing/seeds.h"

namespace ktorba {
namespace {

SequenceInstructionsGenerator encoderFor(std::uint8_t sampleWidthBits, std::uint32_t samplesPerWord,
                                         std::uint32_t minFetchSamples = 64) {
  HWTraits traits;
  traits.sampleWidthBits = sampleWidthBits;
  traits.samplesPerMemoryWord = samplesPerWord;
  traits.minFetchSamples = minFetchSamples;
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
  struct Case {
    std::uint8_t sampleWidthBits;
    std::uint32_t samplesPerWord;
    const char* text;
  };
  for (const Case& c : {Case{7, 8, "sampleWidthBits is below 8"}, Case{16, 0, "samplesPerMemoryWord is 0"}}) {
    SequenceInstructionsGenerator encoder = encoderFor(c.sampleWidthBits, c.samplesPerWord);
    SequenceInstructionWords words;
    for (const auto& encode : std::initializer_list<std::function<void()>>{
             [&] { encoder.encodeScriptStart(words); }, [&] { encoder.encodeScriptEnd(words); },
             [&] { encoder.encodeFetch({}, words); }, [&] { encoder.measureFetch({}); }}) {
      const kterr::Exception failure = caught(encode);
      EXPECT_EQ(failure.code(), ktorba_errors::kErrorInternalSWError.code);
      EXPECT_THAT(failure.what(), testing::HasSubstr(c.text));
    }
  }
}

TEST(InstructionDecoder, DescribesInOneLine) {
  EXPECT_EQ(describeInstruction({{4, 1, 0x08C28133, 0x10000014}}),
            "fetch firstWord=4 wordCount=2 headSkip=3 tailSkip=3 markerMask=129 clearFlag=194 triggerNumber=8 isWait=0 "
            "isFinal=0 markerOffset=5");
  EXPECT_EQ(describeInstruction({{5, 2, 0x27, 0x20000000}}),
            "loopStart iterationCount=5 bodyAddress=2 triggerNumber=8 isUntil=0 isCounted=1 clearFlag=0");
  EXPECT_EQ(describeInstruction({{1, 0, 0, 0x40000000}}), "jump targetAddress=1");
  for (const std::uint32_t opcode : {0u, 6u, 15u}) {
    const SequenceInstructionWords words{{1, 2, 3, opcode << 28}};
    EXPECT_EQ(decodeInstruction(words).format, nullptr);
    EXPECT_EQ(describeInstruction(words), "unknown opcode " + std::to_string(opcode));
  }
}

}  // namespace
}  // namespace ktorba
