#include <gmock/gmock.h>

#include "testing/SimulatedDevice.h"

namespace ktorba {
namespace {

namespace f = fetch_field;

// A streaming waveform of the memory words 10 to 19, four samples each, played over and over.
class Streaming : public testing::Test, protected SimulatedDevice {
 protected:
  Streaming() {
    program({instruction(Opcode::kFetch, {{f::kFirstWord, 10}, {f::kWordCount, 10}}),
             instruction(Opcode::kJump, {{jump_field::kTargetAddress, 0}})});
  }
  void load(std::uint64_t pointer, std::uint64_t enabled = 1) {
    write(Register::kStreamingStartWord, 10);
    write(Register::kStreamingEndWord, 19);
    write(Register::kStreamingEnabled, enabled);
    write(Register::kStreamingWritePointer, pointer);
    write(Register::kStreamingLoadPointer, 1);
  }
  // Plays `samples` from the start, with every word of the range written.
  void playFromStart(std::uint64_t samples) {
    load(19);
    command(Command::kInitiate);
    play(samples);
  }
  std::uint64_t freeWords() { return read(Register::kStreamingFreeSpace); }
  bool hasUnderflow() { return (read(Register::kGenerationStatus) & kStatusUnderflow) != 0; }
  void stream(std::uint64_t firstWord, std::uint64_t words) {
    announce({1, firstWord * 8, words * 8});
    ASSERT_EQ(send(Bytes(words * 8)), 0);
  }
};

TEST_F(Streaming, FreeSpaceIsThatOfTheRangeBehindThePointer) {
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
}

TEST_F(Streaming, PlayingAWordThatWasNotRewrittenIsAnUnderflow) {
  playFromStart(40);
  EXPECT_FALSE(hasUnderflow());
  EXPECT_EQ(freeWords(), 10u);
  stream(10, 3);
  play(12);
  EXPECT_FALSE(hasUnderflow());
  EXPECT_EQ(play(1).size(), 1u) << "generation goes on";
  EXPECT_TRUE(hasUnderflow());
  command(Command::kInitiate);
  EXPECT_FALSE(hasUnderflow());

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

TEST_F(Streaming, PlayingAPartOfAWordAgainTakesARewriting) {
  program({instruction(Opcode::kFetch, {{f::kFirstWord, 10}, {f::kWordCount, 1}, {f::kHeadSkip, 1}, {f::kTailSkip, 1}}),
           instruction(Opcode::kJump, {{jump_field::kTargetAddress, 0}})});
  playFromStart(2);
  stream(10, 1);
  play(2);
  EXPECT_FALSE(hasUnderflow());
  EXPECT_EQ(freeWords(), 0u);
  play(1);
  EXPECT_TRUE(hasUnderflow());
  EXPECT_EQ(freeWords(), 1u);
}

TEST_F(Streaming, AWordLeftByAnAbortIsNotPlayedByTheNextStart) {
  playFromStart(38);
  command(Command::kAbort);
  stream(10, 9);
  command(Command::kInitiate);
  play(1);
  EXPECT_EQ(freeWords(), 0u);
}

TEST_F(Streaming, LoadingTheSameRangeWhilePlayingKeepsTheMarks) {
  playFromStart(20);
  load(19);
  EXPECT_EQ(freeWords(), 5u);
  load(19, 0);
  EXPECT_EQ(freeWords(), 0u) << "switched off";
  play(400);
  EXPECT_FALSE(hasUnderflow());
}

}  // namespace
}  // namespace ktorba
