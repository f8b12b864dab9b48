#include "tools/timeline/describeLength.h"

#include "conventions/conventions.h"
#include "tools/text/durations.h"
#include "tools/text/quantities.h"
#include "tools/timeline/Folding.h"

namespace tools {
namespace {

std::string describeWait(const PlayLength& length, const Program& program, double sampleRateHz) {
  return (waitsInLoop(length, program) ? "repeats until " : "waits for ") + ktorba::triggerName(length.trigger()) +
         " at line " + std::to_string(program.places[length.address()].line) + " from " +
         formatDuration(length.waitingSince(), sampleRateHz) + " on, sample " + formatCount(length.waitingSince());
}

}  // namespace

PlayLength lengthOf(const Program& program, const ProgramBuilder& builder) {
  return fold(StraightPlay(program, builder), {}).length;
}

bool waitsInLoop(const PlayLength& length, const Program& program) {
  return program.origins[length.address()].part == ktorba::InstructionOrigin::Part::kLoopStart;
}

std::string describeLength(const PlayLength& length, const Program& program, double sampleRateHz) {
  switch (length.kind()) {
    case PlayLength::Kind::kExact:
      return "plays " + formatDuration(*length.samples(), sampleRateHz) + ", " + formatCount(*length.samples()) +
             " samples";
    case PlayLength::Kind::kEndless:
      return "plays for ever";
    case PlayLength::Kind::kWaiting:
      return describeWait(length, program, sampleRateHz);
    default:
      return "plays longer than can be counted";
  }
}

}  // namespace tools
