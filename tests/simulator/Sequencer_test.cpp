#include <gmock/gmock.h>

#include <algorithm>
#include <array>

#include "testing/SimulatedDevice.h"

namespace ktorba {
namespace {

namespace f = fetch_field;
namespace l = loop_field;
using testing::ElementsAre;
using testing::HasSubstr;

// Fetches on the small device: 4 samples per word; sample n of the memory holds n + 1.
SequenceInstructionWords fetch(std::uint32_t firstWord, std::uint32_t words,
                               std::initializer_list<FieldValue> more = {}) {
  SequenceInstructionWords result = instruction(Opcode::kFetch, {{f::kFirstWord, firstWord}, {f::kWordCount, words}});
  for (const auto& [field, value] : more) writeField(result, field, value);
  return result;
}

SequenceInstructionWords wait(std::uint32_t words, std::uint32_t trigger = 0, std::uint32_t clear = 0) {
  return instruction(Opcode::kFetch,
                     {{f::kWordCount, words}, {f::kIsWait, 1}, {f::kTriggerNumber, trigger}, {f::kClearFlag, clear}});
}

SequenceInstructionWords end() {
  return instruction(Opcode::kScriptEnd, {{f::kWordCount, 1}, {f::kIsWait, 1}, {f::kIsFinal, 1}});
}

SequenceInstructionWords jump(std::uint32_t target) {
  return instruction(Opcode::kJump, {{jump_field::kTargetAddress, target}});
}

// Counted when `count` is not 0, else for ever.
SequenceInstructionWords loop(Opcode opcode, std::uint32_t body, std::uint32_t count, std::uint32_t clearFlag) {
  return instruction(opcode, {{l::kIterationCount, count},
                              {l::kBodyAddress, body},
                              {l::kTriggerNumber, 8},
                              {l::kIsCounted, count != 0},
                              {l::kClearFlag, clearFlag}});
}
SequenceInstructionWords loopStart(std::uint32_t body, std::uint32_t count = 0) {
  return loop(Opcode::kLoopStart, body, count, 0);
}
SequenceInstructionWords loopEnd(std::uint32_t body, std::uint32_t count = 0, std::uint32_t clearFlag = 0) {
  return loop(Opcode::kLoopEnd, body, count, clearFlag);
}

class Sequencer : public testing::Test, protected SimulatedDevice {
 protected:
  Sequencer() {
    fillWithRamp();
    EXPECT_EQ(ktSim_RecordTrace(number, 1000), 0);
  }
  void start(const std::vector<SequenceInstructionWords>& words) {
    program(words);
    command(Command::kInitiate);
  }
};

TEST_F(Sequencer, PlaysOnceForEachInitiateUnlessAborted) {
  start({wait(1, 1), fetch(2, 3, {{f::kHeadSkip, 3}, {f::kTailSkip, 2}}), wait(1), end()});
  EXPECT_TRUE(state().running);
  EXPECT_THAT(play(1000), ElementsAre(0, 0, 0, 0, 12, 13, 14, 15, 16, 17, 18, 18, 18, 18, 18, 18, 18, 18, 18));
  EXPECT_EQ(read(Register::kGenerationStatus), kStatusDone | kStatusWriteComplete);
  EXPECT_FALSE(state().running);
  EXPECT_EQ(state().samplesPlayed, 19u);
  EXPECT_EQ(state().lastSample, 18u);
  EXPECT_TRUE(play(10).empty());
  command(Command::kInitiate);
  EXPECT_EQ(read(Register::kGenerationStatus) & kStatusDone, 0u);
  EXPECT_THAT(play(5), ElementsAre(0, 0, 0, 0, 12)) << "begins anew, with 0";
  command(Command::kAbort);
  EXPECT_TRUE(play(1).empty());
  EXPECT_EQ(read(Register::kGenerationStatus) & kStatusDone, 0u);
}

TEST_F(Sequencer, LatchesStayUntilAClearFlagOrInitiate) {
  // Trigger 3 is used twice; the clear on the last wait forgets it and keeps 4.
  start({wait(1, 3), wait(1, 3), wait(1, 4, 1u << 2), end()});
  ktSim_RaiseTrigger(number, 3);
  EXPECT_EQ(ktSim_RaiseTrigger(number, 0), KTSIM_E_ARGUMENT);
  EXPECT_EQ(ktSim_RaiseTriggerAt(number, 9, 0), KTSIM_E_ARGUMENT);
  EXPECT_EQ(state().triggerLatches, 1u | 1u << 2) << "initiate latches trigger 1";
  play(9);
  EXPECT_EQ(state().triggerLatches, 1u);
  EXPECT_EQ(state().waitingForTrigger, 4);
  EXPECT_EQ(state().address, 2u);
  command(Command::kInitiate);
  EXPECT_EQ(state().triggerLatches, 1u);
  EXPECT_EQ(play(400).size(), 400u) << "trigger 3 was forgotten";
  EXPECT_EQ(state().address, 0u);
  ktSim_RaiseTriggerAt(number, 3, 1000);
  command(Command::kReset);
  EXPECT_EQ(state().triggerLatches, 0u);
  EXPECT_FALSE(state().running);
  command(Command::kInitiate);
  EXPECT_EQ(play(2000).size(), 2000u);
  EXPECT_EQ(state().waitingForTrigger, 3) << "reset forgets what was scheduled";
}

TEST_F(Sequencer, TraceTellsAddressSampleWordsAndPass) {
  const std::vector<SequenceInstructionWords> words{
      loopStart(1, 2), fetch(0, 1, {{f::kMarkerMask, 0x81}, {f::kMarkerOffset, 3}}), loopEnd(1, 2), end()};
  start(words);
  play(100);
  std::array<ktSim_TraceEntry, 10> trace{};
  std::uint64_t count = 0;
  ASSERT_EQ(ktSim_ReadTrace(number, 10, trace.data(), &count), 0);
  const std::vector<std::array<std::uint64_t, 3>> expected{{0, 0, 0}, {1, 0, 0}, {2, 4, 0},
                                                           {1, 4, 1}, {2, 8, 1}, {3, 8, 0}};
  ASSERT_EQ(count, expected.size());
  for (std::size_t i = 0; i < count; ++i) {
    EXPECT_EQ((std::array<std::uint64_t, 3>{trace[i].address, trace[i].firstSample, trace[i].loopPass}), expected[i]);
    EXPECT_TRUE(std::ranges::equal(trace[i].words, words[trace[i].address].words));
  }
  EXPECT_EQ(counters().markersFired, 4u);
}

TEST_F(Sequencer, MalformedInstructionsStopItWithAFault) {
  const auto withBit = [](SequenceInstructionWords words, std::size_t word, std::uint32_t bit) {
    words.words[word] ^= 1u << bit;
    return words;
  };
  struct Case {
    SequenceInstructionWords words;
    const char* reason;
  };
  const Case cases[] = {
      {{}, "unknown opcode"},
      {{{0, 0, 0, 0x60000000}}, "unknown opcode"},
      {withBit(fetch(0, 1), 2, 28), "bits set that belong to no field"},
      {withBit(jump(0), 1, 0), "bits set that belong to no field"},
      {withBit(loopStart(2), 2, 3), "bits set that belong to no field"},
      {fetch(511, 2), "outside sample memory"},
      {fetch(0xFFFFFFFF, 1), "outside sample memory"},
      {instruction(Opcode::kFetch, {{f::kWordCount, 0}}), "outside sample memory"},  // reads as 2^32 words
      {fetch(0, 1, {{f::kHeadSkip, 2}, {f::kTailSkip, 2}}), "every sample is skipped"},
      {fetch(0, 1, {{f::kHeadSkip, 15}}), "every sample is skipped"},
      {fetch(0, 1, {{f::kMarkerMask, 1}, {f::kMarkerOffset, 4}}), "marker behind the last sample"},
      {fetch(0, 1, {{f::kTriggerNumber, 1}}), "trigger on what is no wait"},
      {wait(1, 9), "trigger above 8"},
      {withBit(wait(1, 2), 2, 8), "marker on a wait for a trigger"},
      {fetch(0, 1, {{f::kIsFinal, 1}}), "final bit"},
      {withBit(end(), 3, 1), "final bit"},
      {withBit(end(), 3, 0), "without its wait bit"},
      {jump(64), "jump outside sequence memory"},
      {loopStart(5), "body does not follow"},
      {withBit(loopStart(2, 1), 2, 4), "both counted and until"},
      {loopEnd(2, 1), "without its loop start"},
  };
  for (const Case& malformed : cases) {
    ASSERT_EQ(ktSim_ClearDeviceFaults(number), 0);
    start({wait(1, 1), malformed.words, end()});
    EXPECT_EQ(play(100).size(), 4u) << malformed.reason;
    ASSERT_EQ(deviceFaults().size(), 1u) << malformed.reason;
    EXPECT_THAT(deviceFaults()[0].text, HasSubstr(malformed.reason));
    EXPECT_EQ(deviceFaults()[0].code, KTSIM_F_INSTRUCTION);
    EXPECT_EQ(deviceFaults()[0].address, 1u);
    EXPECT_EQ(deviceFaults()[0].sample, 4u);
    EXPECT_FALSE(state().running);
    EXPECT_FALSE(state().done);
  }
}

TEST_F(Sequencer, ProgramsThatGoAstrayStopItWithAFault) {
  std::vector<SequenceInstructionWords> deep;
  for (std::uint32_t i = 0; i < 31; ++i) deep.push_back(loopStart(i + 1));
  struct Case {
    std::vector<SequenceInstructionWords> words;
    std::int32_t code;
    const char* reason;
  };
  const Case cases[] = {
      {{jump(0)}, KTSIM_F_NO_SAMPLES, "emit no sample"},
      {{loopStart(1), loopEnd(1)}, KTSIM_F_NO_SAMPLES, "emit no sample"},
      {{loopStart(1, 0xFFFFFFFF), loopEnd(1, 0xFFFFFFFF)}, KTSIM_F_NO_SAMPLES, "emit no sample"},
      {{loopStart(1, 2), loopEnd(1, 3)}, KTSIM_F_INSTRUCTION, "differs from its loop start"},
      {{loopStart(1, 2), loopEnd(1, 2, 4)}, KTSIM_F_INSTRUCTION, "differs from its loop start"},
      {deep, KTSIM_F_INSTRUCTION, "more than 16 loops"},
      {std::vector(64, loopStart(64)), KTSIM_F_INSTRUCTION, "body does not follow"},
  };
  for (const Case& astray : cases) {
    ASSERT_EQ(ktSim_ClearDeviceFaults(number), 0);
    start(astray.words);
    EXPECT_TRUE(play(1000).empty());
    ASSERT_EQ(deviceFaults().size(), 1u) << astray.reason;
    EXPECT_EQ(deviceFaults()[0].code, astray.code);
    EXPECT_THAT(deviceFaults()[0].text, HasSubstr(astray.reason));
  }
  ASSERT_EQ(ktSim_ClearDeviceFaults(number), 0);
  start(std::vector(64, fetch(0, 1)));
  EXPECT_EQ(play(1000).size(), 256u);
  EXPECT_THAT(deviceFaults().at(0).text, HasSubstr("instruction 64: ran off the end of sequence memory"));
  // A loop that is left by a jump and entered again does not pile up.
  start({loopStart(1), fetch(0, 1), jump(0)});
  EXPECT_EQ(play(1000).size(), 1000u);
}

}  // namespace
}  // namespace ktorba
