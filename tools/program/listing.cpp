#include "tools/program/listing.h"

#include "conventions/conventions.h"
#include "ktorba/script/instructionDecoder.h"

namespace tools {
namespace {

using ktorba::DecodedInstruction;
using ktorba::Opcode;

bool isFetch(const DecodedInstruction& instruction) {
  return instruction.is(Opcode::kFetch) || instruction.is(Opcode::kScriptEnd);
}

std::string firedMarkers(std::uint64_t mask) {
  std::string text;
  for (std::uint32_t marker = 0; marker < ktorba::kMarkerCount; ++marker) {
    if ((mask & ktorba::markerBitOf(marker)) != 0) text += " " + ktorba::markerName(marker);
  }
  return text;
}

std::string clearedTriggers(std::uint64_t flags) {
  std::string text;
  for (std::uint32_t trigger = 1; trigger <= ktorba::kHardwareTriggerCount; ++trigger) {
    if ((flags & ktorba::clearFlagOf(trigger)) != 0) text += " " + ktorba::triggerName(trigger);
  }
  return text.empty() ? "" : ", clearing" + text;
}

class Lister {
 public:
  Lister(const Program& program, std::size_t address, const ProgramBuilder& builder)
      : program_(program),
        address_(address),
        builder_(builder),
        instruction_(ktorba::decodeInstruction(program.entry.instructionWords[address])) {}

  ListedInstruction list() const {
    ListedInstruction listed;
    if (isFetch(instruction_)) {
      listed.memoryWords = instruction_[ktorba::fetch_field::kWordCount];
      listed.samples = samples();
      listed.isWaitForTrigger = instruction_[ktorba::fetch_field::kTriggerNumber] != 0;
      listed.meaning = describeFetch(listed);
    } else if (instruction_.is(Opcode::kJump)) {
      listed.meaning = "jump to " + std::to_string(instruction_[ktorba::jump_field::kTargetAddress]);
    } else {
      listed.meaning = describeLoop();
    }
    return listed;
  }

 private:
  std::uint64_t samplesPerWord() const { return builder_.traits().samplesPerMemoryWord; }

  std::uint64_t samples() const {
    return instruction_[ktorba::fetch_field::kWordCount] * samplesPerWord() -
           instruction_[ktorba::fetch_field::kHeadSkip] - instruction_[ktorba::fetch_field::kTailSkip];
  }

  std::string describeFetch(const ListedInstruction& listed) const {
    using namespace ktorba::fetch_field;
    std::string text = describeSource(listed);
    const std::uint64_t mask = instruction_[kMarkerMask];
    if (mask != 0) {
      text += "," + firedMarkers(mask) + " at " + std::to_string(instruction_[kMarkerOffset]);
    }
    return text + clearedTriggers(instruction_[kClearFlag]);
  }

  std::string describeSource(const ListedInstruction& listed) const {
    const ktorba::FetchRecord* fetch = program_.fetchOf(address_);
    if (instruction_.is(Opcode::kScriptEnd)) return "end of the script";
    if (listed.isWaitForTrigger) {
      return "wait until " +
             ktorba::triggerName(static_cast<unsigned>(instruction_[ktorba::fetch_field::kTriggerNumber]));
    }
    if (fetch == nullptr || fetch->isWait) return "wait " + std::to_string(listed.samples);
    const std::string name(fetch->waveformName);
    const std::uint64_t first = firstSample(name);
    return "play " + name + "[" + std::to_string(first) + ", " + std::to_string(first + listed.samples) + ")";
  }

  // Counted from the waveform's first one.
  std::uint64_t firstSample(const std::string& waveform) const {
    const std::uint64_t first =
        instruction_[ktorba::fetch_field::kFirstWord] * samplesPerWord() + instruction_[ktorba::fetch_field::kHeadSkip];
    const std::uint32_t bytesPerSample = builder_.traits().sampleWidthBits / 8;
    return first - builder_.waveforms().getWaveform(waveform).memoryOffset / bytesPerSample;
  }

  std::string describeLoop() const {
    using namespace ktorba::loop_field;
    if (instruction_.is(Opcode::kLoopEnd)) return "loop end, back to " + std::to_string(instruction_[kBodyAddress]);
    const std::uint64_t count = instruction_[kIterationCount];
    std::string text = "loop for ever";
    if (instruction_[kIsCounted] != 0) text = count == 1 ? "loop once" : "loop " + std::to_string(count) + " times";
    if (instruction_[kIsUntil] != 0) {
      text = "loop until " + ktorba::triggerName(static_cast<unsigned>(instruction_[kTriggerNumber]));
    }
    return text + clearedTriggers(instruction_[kClearFlag]);
  }

  const Program& program_;
  std::size_t address_;
  const ProgramBuilder& builder_;
  DecodedInstruction instruction_;
};

}  // namespace

ListedInstruction listInstruction(const Program& program, std::size_t address, const ProgramBuilder& builder) {
  return Lister(program, address, builder).list();
}

}  // namespace tools
