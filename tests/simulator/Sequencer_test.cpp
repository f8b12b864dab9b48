#include <algorithm>
#include <array>

#include "SimulatedDevice.h"

namespace simulator_test {
namespace {

namespace f = ktorba::fetch_field;
namespace l = ktorba::loop_field;
using testing::HasSubstr;

// Fetches on the small device: 4 samples per word; sample n of the memory holds n + 1.
SequenceInstructionWords fetch(std::uint32_t firstWord, std::uint32_t words,
                               std::initializer_list<FieldValue> more = {}) {
  SequenceInstructionWords result = instruction(Opcode::kFetch, {{f::kFirstWord, firstWord}, {f::kWordCount, words}});
  for (const auto& [field, value] : more) ktorba::writeField(result, field, value);
  return result;
}

SequenceInstructionWords wait(std::uint32_t words, std::uint32_t trigger = 0, std::uint32_t clearFlag = 0) {
  return instruction(
      Opcode::kFetch,
      {{f::kWordCount, words}, {f::kIsWait, 1}, {f::kTriggerNumber, trigger}, {f::kClearFlag, clearFlag}});
}

SequenceInstructionWords end(std::uint32_t words = 1) {
  return instruction(Opcode::kScriptEnd, {{f::kWordCount, words}, {f::kIsWait, 1}, {f::kIsFinal, 1}});
}

SequenceInstructionWords jump(std::uint32_t target) {
  return instruction(Opcode::kJump, {{ktorba::jump_field::kTargetAddress, target}});
}

struct Loop {
  std::uint32_t body;
  std::uint32_t count = 0;    // counted, when not 0
  std::uint32_t trigger = 0;  // until, when not 0
  std::uint32_t clearFlag = 0;
};

SequenceInstructionWords loop(Opcode opcode, const Loop& of) {
  return instruction(opcode, {{l::kIterationCount, of.count},
                              {l::kBodyAddress, of.body},
                              {l::kTriggerNumber, of.trigger == 0 ? 8 : of.trigger},
                              {l::kIsUntil, of.trigger != 0},
                              {l::kIsCounted, of.count != 0},
                              {l::kClearFlag, of.clearFlag}});
}
SequenceInstructionWords loopStart(const Loop& of) { return loop(Opcode::kLoopStart, of); }
SequenceInstructionWords loopEnd(const Loop& of) { return loop(Opcode::kLoopEnd, of); }

std::vector<int> joined(std::initializer_list<std::vector<int>> parts) {
  std::vector<int> all;
  for (const std::vector<int>& part : parts) all.insert(all.end(), part.begin(), part.end());
  return all;
}

std::vector<int> held(int value, std::size_t count) { return std::vector<int>(count, value); }

class Sequencer : public SimulatedDevice {
 protected:
  Sequencer() {
    add();
    fillWithRamp();
    EXPECT_EQ(ktSim_RecordTrace(generator, 1000), 0);
  }
  void start(const std::vector<SequenceInstructionWords>& words) {
    program(words);
    command(Command::kInitiate);
  }
};

TEST_F(Sequencer, PlaysAScriptAsTheEncoderWritesIt) {
  start({wait(1, 1), fetch(2, 3, {{f::kHeadSkip, 3}, {f::kTailSkip, 2}}), wait(2), end()});
  EXPECT_TRUE(state().running);
  const Played played = play(1000);
  EXPECT_EQ(played.samples, joined({held(0, 4), ramp(12, 7), held(18, 8), held(18, 4)}));
  EXPECT_EQ(played.markers, held(0, 23));
  EXPECT_EQ(read(Register::kGenerationStatus), ktorba::kStatusDone | ktorba::kStatusWriteComplete);
  EXPECT_FALSE(state().running);
  EXPECT_EQ(state().samplesPlayed, 23u);
  EXPECT_EQ(state().lastSample, 18u);
  EXPECT_EQ(traceAddresses(), (std::vector<std::uint32_t>{0, 1, 2, 3}));
  EXPECT_TRUE(play(10).samples.empty());
  command(Command::kInitiate);
  EXPECT_EQ(read(Register::kGenerationStatus) & ktorba::kStatusDone, 0u);
  EXPECT_EQ(play(5).samples, joined({held(0, 4), {12}})) << "begins anew, with 0";
}

// The same samples, however the advance is cut up; done with the last sample, not after it.
TEST_F(Sequencer, PlaysTheSameInPieces) {
  const std::vector<SequenceInstructionWords> words{wait(1, 1), loopStart({2, 3}),
                                                    fetch(0, 2, {{f::kMarkerMask, 0x81}, {f::kMarkerOffset, 5}}),
                                                    loopEnd({2, 3}), end()};
  const auto markers = [](const Played& played) { return played.markers; };
  start(words);
  const Played whole = play(1000);
  EXPECT_EQ(whole.samples, joined({held(0, 4), ramp(1, 8), ramp(1, 8), ramp(1, 8), held(8, 4)}));
  std::vector<int> expected(32, 0);
  expected[9] = expected[17] = expected[25] = 0x81;
  EXPECT_EQ(whole.markers, expected);
  EXPECT_EQ(counters().markersFired, 6u);
  for (const std::uint64_t piece : {1u, 3u, 5u, 8u, 31u}) {
    start(words);
    Played all;
    while (!state().done) {
      const Played part = play(piece);
      ASSERT_FALSE(part.samples.empty()) << piece;
      all = {joined({all.samples, part.samples}), joined({markers(all), markers(part)})};
    }
    EXPECT_EQ(all.samples, whole.samples) << piece;
    EXPECT_EQ(all.markers, whole.markers) << piece;
  }
}

// Passes that fit no power of two, over more samples than are prepared at a time.
TEST_F(Sequencer, PlaysManyPassesExactly) {
  start({loopStart({1, 100}), fetch(0, 13, {{f::kMarkerMask, 1}, {f::kMarkerOffset, 37}}), loopEnd({1, 100}), end()});
  const Played played = play(10000);
  ASSERT_EQ(played.samples.size(), 5204u);
  for (std::size_t n = 0; n < 5200; ++n) {
    ASSERT_EQ(played.samples[n], static_cast<int>(n % 52 + 1)) << n;
    ASSERT_EQ(played.markers[n], n % 52 == 37 ? 1 : 0) << n;
  }
}

TEST_F(Sequencer, MarkerIsHighForItsSampleAloneAtEveryOffset) {
  for (std::uint32_t offset = 0; offset < 256; ++offset) {
    start({fetch(0, 64, {{f::kMarkerMask, 1u << (offset % 8)}, {f::kMarkerOffset, offset}}), end()});
    std::vector<int> expected(256, 0);
    expected[offset] = 1 << (offset % 8);
    ASSERT_EQ(play(256).markers, expected);
  }
}

// A trigger counts for a pass when it is latched by the pass's end, the sample after it included.
TEST_F(Sequencer, WaitRepeatsUntilItsTriggerIsLatchedAtTheEndOfAPass) {
  const std::vector<SequenceInstructionWords> words{wait(2, 5), fetch(0, 1), end()};
  struct Case {
    std::uint64_t raisedAt, waited;
  };
  for (const Case& at : {Case{0, 8}, Case{1, 8}, Case{8, 8}, Case{9, 16}, Case{16, 16}, Case{800, 800}}) {
    program(words);
    ASSERT_EQ(ktSim_RaiseTriggerAt(generator, 5, at.raisedAt), 0);
    command(Command::kInitiate);
    EXPECT_EQ(play(5000).samples, joined({held(0, at.waited), ramp(1, 4), held(4, 4)})) << at.raisedAt;

    start(words);  // by hand, in the middle of an advance that knew nothing of it
    play(at.raisedAt);
    EXPECT_EQ(state().waitingForTrigger, at.raisedAt == 0 ? 0 : 5);
    ASSERT_EQ(ktSim_RaiseTrigger(generator, 5), 0);
    EXPECT_EQ(play(5000).samples.size(), at.waited - at.raisedAt + 8) << at.raisedAt;
  }
  start(words);
  play(11);
  ASSERT_EQ(ktSim_RaiseTriggerAt(generator, 5, 13), 0);
  EXPECT_EQ(play(5000).samples.size(), 5u + 8) << "scheduled while it waits";
  EXPECT_EQ(ktSim_RaiseTrigger(generator, 0), KTSIM_E_ARGUMENT);
  EXPECT_EQ(ktSim_RaiseTriggerAt(generator, 9, 0), KTSIM_E_ARGUMENT);
}

TEST_F(Sequencer, LatchesStayUntilAClearFlagOrInitiate) {
  // Trigger 3 is used twice; the clear on the last wait forgets it and keeps 4.
  start({wait(1, 3), wait(1, 3), wait(1, 4, 1u << 2), end()});
  ktSim_RaiseTrigger(generator, 3);
  EXPECT_EQ(state().triggerLatches, 1u | 1u << 2) << "initiate latches trigger 1";
  play(9);
  EXPECT_EQ(state().triggerLatches, 1u);
  EXPECT_EQ(state().waitingForTrigger, 4);
  EXPECT_EQ(state().address, 2u);
  command(Command::kInitiate);
  EXPECT_EQ(state().triggerLatches, 1u);
  EXPECT_EQ(play(400).samples.size(), 400u) << "trigger 3 was forgotten";
  EXPECT_EQ(state().address, 0u);
  ktSim_RaiseTriggerAt(generator, 3, 1000);
  command(Command::kReset);
  EXPECT_EQ(state().triggerLatches, 0u);
  EXPECT_FALSE(state().running);
  command(Command::kInitiate);
  EXPECT_EQ(play(2000).samples.size(), 2000u) << "reset forgets what was scheduled";
}

TEST_F(Sequencer, LoopsEndByCountByTriggerOrNever) {
  const Loop counted{2, 3};
  start({wait(1, 1), loopStart(counted), fetch(0, 1), loopEnd(counted), fetch(9, 1), end()});
  EXPECT_EQ(play(100).samples, joined({held(0, 4), ramp(1, 4), ramp(1, 4), ramp(1, 4), ramp(37, 4), held(40, 4)}));

  const Loop forever{1};
  start({loopStart(forever), fetch(0, 1), loopEnd(forever), end()});
  EXPECT_EQ(play(4000).samples.size(), 4000u);
  command(Command::kAbort);
  EXPECT_TRUE(play(1).samples.empty());
  EXPECT_EQ(read(Register::kGenerationStatus) & ktorba::kStatusDone, 0u);

  // The loop's clear acts when it is entered, not at each pass: trigger 8 was latched before, and again at sample 13.
  const Loop until{2, 0, 8, 1u << 7};
  program({wait(1, 1), loopStart(until), fetch(0, 1), loopEnd(until), end()});
  ktSim_RaiseTriggerAt(generator, 8, 2);
  ktSim_RaiseTriggerAt(generator, 8, 13);
  command(Command::kInitiate);
  EXPECT_EQ(play(1000).samples.size(), 4u + 3 * 4 + 4);

  // Nested, and an endless script by a jump.
  const Loop outer{1, 2};
  const Loop inner{3, 3};
  start({loopStart(outer), fetch(0, 1), loopStart(inner), fetch(1, 1), loopEnd(inner), loopEnd(outer), jump(0)});
  const std::vector<int> pass = joined({ramp(1, 4), ramp(5, 4), ramp(5, 4), ramp(5, 4)});
  EXPECT_EQ(play(50).samples, joined({pass, pass, pass, {1, 2}}));
}

TEST_F(Sequencer, TraceTellsAddressSampleWordsAndPass) {
  const Loop counted{1, 2};
  const std::vector<SequenceInstructionWords> words{loopStart(counted), fetch(0, 1), loopEnd(counted), end()};
  start(words);
  play(100);
  std::array<ktSim_TraceEntry, 10> trace{};
  std::uint64_t count = 0;
  ASSERT_EQ(ktSim_ReadTrace(generator, 10, trace.data(), &count), 0);
  const std::vector<std::array<std::uint64_t, 3>> expected{{0, 0, 0}, {1, 0, 0}, {2, 4, 0},
                                                           {1, 4, 1}, {2, 8, 1}, {3, 8, 0}};
  ASSERT_EQ(count, expected.size());
  for (std::size_t i = 0; i < count; ++i) {
    EXPECT_EQ((std::array<std::uint64_t, 3>{trace[i].address, trace[i].firstSample, trace[i].loopPass}), expected[i]);
    EXPECT_TRUE(std::ranges::equal(trace[i].words, words[trace[i].address].words));
  }
}

// A running program takes up instructions and samples that are written while it plays.
TEST_F(Sequencer, ReadsMemoryAsItIsWhenItIsPlayed) {
  start({fetch(0, 1), jump(0)});
  play(4);
  program({fetch(5, 1)});
  const std::int16_t changed[] = {70, 71};
  ASSERT_EQ(ktSim_WriteSampleMemory(generator, 44, changed, 4), 0);
  EXPECT_EQ(play(4).samples, (std::vector<int>{21, 22, 70, 71}));
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
      {{{0, 0, 0, 0xF0000000}}, "unknown opcode"},
      {withBit(fetch(0, 1), 2, 28), "bits set that belong to no field"},
      {withBit(fetch(0, 1), 3, 10), "bits set that belong to no field"},
      {withBit(jump(0), 1, 0), "bits set that belong to no field"},
      {withBit(loopStart({2}), 2, 3), "bits set that belong to no field"},
      {fetch(127, 2), "outside sample memory"},
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
      {jump(32), "jump outside sequence memory"},
      {loopStart({5}), "body does not follow"},
      {withBit(loopStart({2, 1}), 2, 4), "both counted and until"},
      {loopEnd({2, 1}), "without its loop start"},
  };
  for (const Case& malformed : cases) {
    ASSERT_EQ(ktSim_ClearDeviceFaults(generator), 0);
    start({wait(1, 1), malformed.words, end()});
    EXPECT_EQ(play(100).samples.size(), 4u) << malformed.reason;
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
  const Loop counted{1, 2};
  const Loop otherCount{1, 3};
  const Loop otherClear{1, 2, 0, 4};
  std::vector<SequenceInstructionWords> deep;
  for (std::uint32_t i = 0; i < 31; ++i) deep.push_back(loopStart({i + 1}));
  struct Case {
    std::vector<SequenceInstructionWords> words;
    std::int32_t code;
    const char* reason;
  };
  const Case cases[] = {
      {{jump(0)}, KTSIM_F_NO_SAMPLES, "emit no sample"},
      {{loopStart({1}), loopEnd({1})}, KTSIM_F_NO_SAMPLES, "emit no sample"},
      {{loopStart({1, 0xFFFFFFFF}), loopEnd({1, 0xFFFFFFFF})}, KTSIM_F_NO_SAMPLES, "emit no sample"},
      {{loopStart(counted), loopEnd(otherCount)}, KTSIM_F_INSTRUCTION, "differs from its loop start"},
      {{loopStart(counted), loopEnd(otherClear)}, KTSIM_F_INSTRUCTION, "differs from its loop start"},
      {deep, KTSIM_F_INSTRUCTION, "more than 16 loops"},
      {std::vector(32, loopStart({32})), KTSIM_F_INSTRUCTION, "body does not follow"},
  };
  for (const Case& astray : cases) {
    ASSERT_EQ(ktSim_ClearDeviceFaults(generator), 0);
    start(astray.words);
    EXPECT_TRUE(play(1000).samples.empty());
    ASSERT_EQ(deviceFaults().size(), 1u) << astray.reason;
    EXPECT_EQ(deviceFaults()[0].code, astray.code);
    EXPECT_THAT(deviceFaults()[0].text, HasSubstr(astray.reason));
  }
  ASSERT_EQ(ktSim_ClearDeviceFaults(generator), 0);
  start(std::vector(32, fetch(0, 1)));
  EXPECT_EQ(play(1000).samples.size(), 128u);
  EXPECT_THAT(deviceFaults().at(0).text, HasSubstr("instruction 32: ran off the end of sequence memory"));
  // A loop that is left by a jump and entered again does not pile up.
  start({loopStart({1}), fetch(0, 1), jump(0)});
  EXPECT_EQ(play(1000).samples.size(), 1000u);
}

}  // namespace
}  // namespace simulator_test
