#include "cli/commands/ComputedPlay.h"

#include <algorithm>

#include "conventions/conventions.h"
#include "ktcheckname/compareNames.h"
#include "platform/system/paths.h"
#include "tools/text/Refusal.h"
#include "tools/text/quantities.h"
#include "tools/text/words.h"
#include "tools/timeline/BlockRenderer.h"
#include "tools/timeline/raisedTriggers.h"

namespace tools::cli {
namespace {

constexpr std::uint64_t kDefaultLimit = 10'000'000;  // samples
constexpr std::uint64_t kRoundsShown = 3;            // of what repeats without end

using Part = ktorba::InstructionOrigin::Part;

const char* describe(CountFault fault) {
  switch (fault) {
    case CountFault::kNegative:
      return "is negative";
    case CountFault::kFraction:
      return "is not a whole number of samples";
    case CountFault::kTooLarge:
      return "is more than the 2^64 - 2 samples that can be counted";
    default:
      return "is neither a number of samples nor a time";
  }
}

std::uint64_t readSamples(const std::string& option, const std::string& text, double sampleRateHz) {
  const SampleCount count = readSampleCount(text, sampleRateHz);
  if (count.fault == CountFault::kNone) return count.samples;
  throw Refusal(option + ": \"" + text + "\" " + describe(count.fault), "Such as 5000, 1M or 20ms.");
}

std::uint64_t readAtLeastOne(const std::string& option, const std::string& text, double sampleRateHz) {
  const std::uint64_t samples = readSamples(option, text, sampleRateHz);
  if (samples == 0) throw Refusal(option + ": \"" + text + "\" is no sample at all", "One sample is the least.");
  return samples;
}

// What a word of the program is in a recording.
PlayedInstruction describeInstruction(const Program& program, std::size_t address) {
  const ktorba::FetchRecord* fetch = program.fetchOf(address);
  if (fetch == nullptr) {
    const bool isStart = program.origins[address].part == Part::kScriptStart;
    return {isStart ? SegmentKind::kWaitForTrigger : SegmentKind::kWait,
            isStart ? ktorba::triggerName(ktorba::kStartTrigger) : "", 0, 0};
  }
  const Place& place = program.places[address];
  const std::string waveform(fetch->waveformName);
  if (!fetch->isWait) return {SegmentKind::kWaveform, waveform, place.line, place.position};
  if (fetch->triggerNumber == 0) return {SegmentKind::kWait, "", place.line, place.position};
  return {SegmentKind::kWaitForTrigger, ktorba::triggerName(fetch->triggerNumber), place.line, place.position};
}

std::string titleOf(const LoadedScript& loaded, const Program& program) {
  return platform::toText(platform::toPath(loaded.file.name()).filename()) + " \u2014 " + program.entry.script.name;
}

std::vector<PlayedInstruction> describeInstructions(const Program& program) {
  std::vector<PlayedInstruction> instructions;
  for (std::size_t address = 0; address < program.origins.size(); ++address) {
    const ktorba::FetchRecord* fetch = program.fetchOf(address);
    const bool isSplit = fetch != nullptr && program.fetchOf(address - 1) == fetch;
    instructions.push_back(describeInstruction(program, address));
    instructions.back().firstOfFetch =
        isSplit ? instructions[address - 1].firstOfFetch : static_cast<std::uint32_t>(address);
  }
  return instructions;
}

TimelineWaveforms waveformsOf(const Timeline& timeline, const LoadedScript& loaded) {
  TimelineWaveforms waveforms;
  for (const std::string& name : timeline.play().waveforms()) {
    const auto isIt = [&](const NamedWaveform& named) { return ktcheckname::compareNames(named.name, name) == 0; };
    waveforms.push_back(std::ranges::find_if(loaded.waveforms, isIt)->waveform.samples);
  }
  return waveforms;
}

}  // namespace

unsigned triggersUsedBy(const StraightPlay& play) {
  unsigned used = 0;
  const auto use = [&used](std::uint8_t trigger, std::uint8_t clearFlag) {
    used |= clearFlag;
    if (trigger != 0) used |= ktorba::clearFlagOf(trigger);
  };
  for (const Step& step : play.steps()) use(step.trigger, step.clearFlag);
  for (const Block& block : play.blocks()) use(block.trigger, block.clearFlag);
  return used;
}

void requireUse(const std::vector<RaisedTrigger>& raised, unsigned used) {
  std::vector<std::string> names;
  for (unsigned trigger = ktorba::kStartTrigger + 1; trigger <= ktorba::kHardwareTriggerCount; ++trigger) {
    if ((used & ktorba::clearFlagOf(trigger)) != 0) names.push_back(ktorba::triggerName(trigger));
  }
  for (const RaisedTrigger& event : raised) {
    if ((used & ktorba::clearFlagOf(event.trigger)) != 0) continue;
    throw Refusal("--trigger: nothing here uses " + ktorba::triggerName(event.trigger),
                  names.empty() ? "No trigger is used." : "What is used: " + join(names) + ".");
  }
}

std::string UnmetWait::describe() const {
  return "instruction " + std::to_string(address) + (isLoop ? " still repeats until " : " still waits for ") +
         ktorba::triggerName(trigger);
}

ComputedPlay::ComputedPlay(const WindowOptions& window, const GeneratorOptions& generator, const LoadedScript& loaded,
                           const Program& program, Unlimited unlimited)
    : program_(program),
      triggers_(readTriggers(window.triggers, generator.sampleRateHz)),
      timeline_(StraightPlay(program, loaded.builder), triggers_),
      waveforms_(waveformsOf(timeline_, loaded)),
      unlimited_(unlimited) {
  header_.title = titleOf(loaded, program);
  header_.sampleRateHz = generator.sampleRateHz;
  header_.sampleWidthBits = generator.sampleWidthBits;
  header_.program = describeInstructions(program);
  chooseWindow(window);
  if (ending_ == PlayEnding::kLimit) unmetWait_ = findUnmetWait();
  for (unsigned marker = 0; marker < ktorba::kMarkerCount; ++marker) {
    if (samplesAt(marker) != 0) header_.markerMask |= ktorba::markerBitOf(marker);
  }
  for (const auto& [sample, trigger] : triggers_) {
    if (sample >= header_.firstSample && sample < header_.endSample()) header_.triggers.push_back({sample, trigger});
  }
}

// Where no limit is set, what was asked for by length is played however long it is.
void ComputedPlay::chooseWindow(const WindowOptions& window) {
  const double rateHz = header_.sampleRateHz;
  const std::uint64_t first = window.from.empty() ? 0 : readSamples("--from", window.from, rateHz);
  const std::uint64_t limit = limitOf(window, first);
  const std::uint64_t end = std::min(timeline_.sampleCount(), limit);
  if (first >= end) {
    throw Refusal("--from: sample " + formatCount(first) + " is not played: " + describeEnd(end),
                  "Begin at sample " + formatCount(end - 1) + " or before.");
  }
  header_.firstSample = first;
  header_.sampleCount = end - first;
  ending_ = end < timeline_.sampleCount() ? PlayEnding::kLimit : PlayEnding::kEnd;
  if (window.length.empty()) return;
  const std::uint64_t length = readAtLeastOne("--length", window.length, rateHz);
  if (length > end - first) {
    throw Refusal("--length: " + formatCount(length) + " samples from sample " + formatCount(first) +
                      " on are more than there are: " + describeEnd(end),
                  "From there on, " + formatCount(end - first) + " is the most.");
  }
  header_.sampleCount = length;
  if (length < end - first) ending_ = PlayEnding::kWindow;
}

std::uint64_t ComputedPlay::limitOf(const WindowOptions& window, std::uint64_t first) const {
  if (!window.limit.empty()) return readAtLeastOne("--limit", window.limit, header_.sampleRateHz);
  if (!window.length.empty()) return kBeyond - 1;
  return std::min(kBeyond - 1,
                  unlimited_ == Unlimited::kTenMillion ? extentSum(first, kDefaultLimit) : endOfWhatMatters(first));
}

// Of a wait without end, as much again as an eighth of what goes before.
std::uint64_t ComputedPlay::endOfWhatMatters(std::uint64_t first) const {
  const PlayLength& length = timeline_.length();
  if (length.kind() == PlayLength::Kind::kExact || length.kind() == PlayLength::Kind::kTooLong) return kBeyond - 1;
  const Stretch& last = timeline_.stretches().back();
  std::uint64_t rounds = extentProduct(kRoundsShown, last.period);
  if (last.repeats == Stretch::Repeats::kWait) rounds = std::max(rounds, last.firstSample / 8);
  return extentSum(std::max(first, last.firstSample), rounds);
}

std::string ComputedPlay::describeEnd(std::uint64_t end) const {
  if (end == timeline_.sampleCount()) return "the script plays " + formatCount(end) + " samples";
  return "the limit is " + formatCount(end) + " samples";
}

std::uint64_t ComputedPlay::samplesAt(unsigned marker) const {
  return timeline_.markerCount(marker, header_.firstSample, header_.endSample());
}

// A wait that the trigger ends in its first pass has not waited in vain.
std::optional<UnmetWait> ComputedPlay::findUnmetWait() const {
  const Run run = *timeline_.runAt(header_.endSample() - 1);
  const Step& step = timeline_.play().steps()[run.step];
  const Block& block = timeline_.play().blocks()[run.block];
  if (program_.origins[step.address].part != Part::kFetch) return std::nullopt;
  const bool goesOn = run.endSample() > header_.endSample() && run.sampleCount > step.sampleCount;
  if (step.trigger != 0 && goesOn) return UnmetWait{step.address, step.trigger, false};
  if (block.kind != ktorba::LoopKind::kUntilTrigger) return std::nullopt;
  return UnmetWait{block.address, block.trigger, true};
}

Diagnostic ComputedPlay::diagnose(const UnmetWait& wait) const {
  return {Diagnostic::Severity::kWarning, program_.places[wait.address],
          "At the limit of " + formatCount(header_.endSample()) + " samples, " + wait.describe(),
          "Raise it with --trigger " + ktorba::triggerName(wait.trigger) + "@WHEN, or play longer with --limit."};
}

void ComputedPlay::perform(Outputs& outputs, const std::function<void(double)>& show) const {
  BlockRenderer renderer(timeline_, waveforms_, header_.sampleWidthBits, outputs.wanted(), header_.firstSample);
  for (std::uint64_t left = header_.sampleCount; left > 0 && outputs.wanted().any();) {
    const std::uint64_t count = std::min(left, BlockRenderer::kMostSamples);
    outputs.take(renderer.next(count));
    left -= count;
    show(1 - static_cast<double>(left) / static_cast<double>(header_.sampleCount));
  }
}

}  // namespace tools::cli
