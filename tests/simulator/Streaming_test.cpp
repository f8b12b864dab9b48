#include "SimulatedDevice.h"

namespace simulator_test {
namespace {

namespace f = ktorba::fetch_field;

// A streaming waveform of the memory words 10 to 19, four samples each, played over and over.
class Streaming : public SimulatedDevice {
 protected:
  Streaming() {
    add();
    program({instruction(Opcode::kFetch, {{f::kFirstWord, 10}, {f::kWordCount, 10}}),
             instruction(Opcode::kJump, {{ktorba::jump_field::kTargetAddress, 0}})});
  }
  void load(std::uint64_t pointer, std::uint64_t enabled = 1) {
    write(Register::kStreamingStartWord, 10);
    write(Register::kStreamingEndWord, 19);
    write(Register::kStreamingEnabled, enabled);
    write(Register::kStreamingWritePointer, pointer);
    write(Register::kStreamingLoadPointer, 1);
  }
  std::uint64_t freeWords() { return read(Register::kStreamingFreeSpace); }
  bool hasUnderflow() { return (read(Register::kGenerationStatus) & ktorba::kStatusUnderflow) != 0; }
  void stream(std::uint64_t firstWord, std::uint64_t words) {
    announce({1, firstWord * 8, words * 8, UINT64_MAX, UINT64_MAX});
    ASSERT_EQ(send(Bytes(words * 8)), 0);
  }
};

TEST_F(Streaming, FreeSpaceFollowsWritingAndPlaying) {
  EXPECT_EQ(freeWords(), 0u) << "no range loaded";
  struct Case {
    std::uint64_t pointer, free;
  };
  for (const Case& loaded : {Case{19, 0}, Case{14, 5}, Case{10, 9}, Case{0, 10}, Case{9, 10}, Case{20, 10}}) {
    load(loaded.pointer);
    EXPECT_EQ(freeWords(), loaded.free) << loaded.pointer;
  }
  stream(5, 8);
  EXPECT_EQ(freeWords(), 7u) << "words outside the range do not count";
  stream(10, 10);
  command(Command::kInitiate);
  play(3);
  EXPECT_EQ(freeWords(), 0u) << "a word is played with its last sample";
  play(1);
  EXPECT_EQ(freeWords(), 1u);
  play(31);
  EXPECT_EQ(freeWords(), 8u);
  stream(10, 8);
  EXPECT_EQ(freeWords(), 0u);
  EXPECT_FALSE(hasUnderflow());
}

TEST_F(Streaming, PlayingAWordThatWasNotRewrittenIsAnUnderflow) {
  load(19);
  command(Command::kInitiate);
  play(40);
  EXPECT_FALSE(hasUnderflow());
  EXPECT_EQ(freeWords(), 10u);
  stream(10, 3);
  play(12);
  EXPECT_FALSE(hasUnderflow());
  EXPECT_EQ(play(1).samples.size(), 1u) << "generation goes on";
  EXPECT_TRUE(hasUnderflow());
  command(Command::kInitiate);
  EXPECT_FALSE(hasUnderflow());

  load(12);
  command(Command::kAbort);
  load(12);
  command(Command::kInitiate);
  play(12);
  EXPECT_FALSE(hasUnderflow());
  play(1);
  EXPECT_TRUE(hasUnderflow()) << "never written since the pointer was loaded";
  command(Command::kReset);
  EXPECT_FALSE(hasUnderflow());
}

// A host that keeps up for a hundred rounds, in steps that share no factor with the words.
TEST_F(Streaming, KeepsUpForManyRounds) {
  load(19);
  command(Command::kInitiate);
  std::uint64_t next = 0;
  for (int step = 0; step < 4000 / 7; ++step) {
    play(7);
    const std::uint64_t free = freeWords();
    for (std::uint64_t word = 0; word < free; ++word) stream(10 + (next + word) % 10, 1);
    next += free;
    ASSERT_FALSE(hasUnderflow()) << step;
  }
  EXPECT_EQ(next, 4000u / 7 * 7 / 4);
}

SequenceInstructionWords part(std::uint32_t first, std::uint32_t words, std::uint32_t head, std::uint32_t tail) {
  return instruction(Opcode::kFetch,
                     {{f::kFirstWord, first}, {f::kWordCount, words}, {f::kHeadSkip, head}, {f::kTailSkip, tail}});
}

// Instructions that share a memory word, as fetches split at a marker do, play it once.
TEST_F(Streaming, AWordSharedByTwoFetchesIsPlayedOnce) {
  // The last word is never played to its end: it counts once another is played.
  program({part(10, 5, 0, 2), part(14, 1, 2, 0), part(15, 5, 0, 3), part(10, 1, 0, 0)});
  load(19);
  command(Command::kInitiate);
  play(18);
  EXPECT_EQ(freeWords(), 4u);
  play(2);
  EXPECT_EQ(freeWords(), 5u);
  play(17);
  EXPECT_EQ(freeWords(), 9u);
  EXPECT_FALSE(hasUnderflow());
  stream(10, 1);
  play(1);
  EXPECT_EQ(freeWords(), 9u);
  EXPECT_FALSE(hasUnderflow());
}

TEST_F(Streaming, PlayingAPartOfAWordAgainTakesARewriting) {
  program({part(10, 1, 1, 1), instruction(Opcode::kJump, {{ktorba::jump_field::kTargetAddress, 0}})});
  load(19);
  command(Command::kInitiate);
  play(2);
  stream(10, 1);
  play(2);
  EXPECT_FALSE(hasUnderflow());
  EXPECT_EQ(freeWords(), 0u);
  play(1);
  EXPECT_TRUE(hasUnderflow());
  EXPECT_EQ(freeWords(), 1u);
}

TEST_F(Streaming, AWordLeftByAnAbortIsNotPlayedByTheNextStart) {
  load(19);
  command(Command::kInitiate);
  play(38);
  command(Command::kAbort);
  stream(10, 9);
  command(Command::kInitiate);
  play(1);
  EXPECT_EQ(freeWords(), 0u);
}

TEST_F(Streaming, LoadingTheSameRangeWhilePlayingKeepsTheMarks) {
  load(19);
  command(Command::kInitiate);
  play(20);
  load(19);
  EXPECT_EQ(freeWords(), 5u);
  load(19, 0);
  EXPECT_EQ(freeWords(), 0u) << "switched off";
  play(400);
  EXPECT_FALSE(hasUnderflow());
}

TEST_F(Streaming, RegistersMayBeMissing) {
  ktSim_Traits traits = smallTraits();
  traits.hasStreamingRegisters = false;
  ASSERT_EQ(ktSim_DestroyFpga(fpga.fpgaSession) + ktSim_CreateFpga(&fpga), 0);
  add(traits);
  for (auto number = Register::kStreamingStartWord; number <= Register::kStreamingLoadPointer;
       number = static_cast<Register>(static_cast<int>(number) + 1)) {
    EXPECT_EQ(write(number, 0).code, KTSIM_E_REGISTER);
  }
}

}  // namespace
}  // namespace simulator_test
