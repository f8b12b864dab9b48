#include "cli/commands/Play.h"

#include <algorithm>
#include <filesystem>

#include "cli/console.h"
#include "conventions/conventions.h"
#include "tools/text/Refusal.h"
#include "tools/text/quantities.h"

namespace tools::cli {
namespace {

constexpr std::uint64_t kSamplesPerPoll = 1u << 16;
constexpr std::uint64_t kMostReserved = 1u << 26;              // samples; longer plays grow as they go
constexpr std::uint64_t kMostPlayed = std::uint64_t{1} << 32;  // samples; they are kept in memory

using Part = ktorba::InstructionOrigin::Part;

// The hardware trigger that scripts know by that name; 0 when there is none.
unsigned findTrigger(std::string_view name) {
  for (std::uint32_t number = 0; number < ktorba::kTriggerCount; ++number) {
    const unsigned trigger = ktorba::hardwareTriggerOf(number);
    if (name == ktorba::triggerName(trigger)) return trigger;
  }
  return 0;
}

TriggerEvent parseTrigger(const std::string& argument, double sampleRateHz) {
  const std::size_t at = argument.find('@');
  const unsigned trigger = findTrigger(std::string_view(argument).substr(0, at));
  const auto sample = at == std::string::npos
                          ? std::nullopt
                          : parseSampleCount(std::string_view(argument).substr(at + 1), sampleRateHz);
  if (trigger == 0 || !sample) {
    throw Refusal("\"" + argument + "\" is not of the form TRIGGER@WHEN",
                  "TRIGGER is trigger1 to trigger7, WHEN a number of samples or a time after the start: trigger3@20ms");
  }
  return {*sample, trigger};
}

std::vector<TriggerEvent> parseTriggers(const PlayOptions& options) {
  std::vector<TriggerEvent> triggers;
  for (const std::string& argument : options.triggers) {
    triggers.push_back(parseTrigger(argument, options.generator.sampleRateHz));
  }
  std::stable_sort(triggers.begin(), triggers.end(),
                   [](const TriggerEvent& a, const TriggerEvent& b) { return a.sample < b.sample; });
  return triggers;
}

std::uint64_t parseLimit(const PlayOptions& options) {
  const auto limit = parseSampleCount(options.limit, options.generator.sampleRateHz);
  if (!limit || *limit == 0) {
    throw Refusal("--limit: \"" + options.limit + "\" is neither a number of samples nor a time");
  }
  if (*limit > kMostPlayed) throw Refusal("--limit: at most " + formatCount(kMostPlayed) + " samples can be kept");
  return *limit;
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

}  // namespace

std::string UnmetWait::describe() const {
  return "instruction " + std::to_string(address) + (isLoop ? " still repeats until " : " still waits for ") +
         ktorba::triggerName(trigger);
}

Play::Play(const PlayOptions& options, const LoadedScript& loaded, const Program& program)
    : loaded_(loaded),
      program_(program),
      triggers_(parseTriggers(options)),
      limit_(parseLimit(options)),
      host_(options.generator) {
  recording_.title = options.title.empty()
                         ? std::filesystem::path(loaded.file.name()).filename().string() + " \u2014 " + scriptName()
                         : options.title;
  recording_.sampleRateHz = options.generator.sampleRateHz;
  recording_.samples = SampleBuffer(options.generator.sampleWidthBits);
  recording_.samples.reserve(std::min(limit_, kMostReserved));
  for (std::size_t address = 0; address < program.origins.size(); ++address) {
    recording_.program.push_back(describeInstruction(program, address));
  }
}

void Play::run() {
  for (const NamedWaveform& named : loaded_.waveforms) host_.writeWaveform(named.name, named.waveform.samples);
  host_.writeScript(loaded_.file.text());
  host_.selectScript(scriptName());
  host_.start();
  pollToTheEnd();
  forgetLateTriggers();
  if (isAtLimit_) host_.abort();
}

void Play::pollToTheEnd() {
  ProgressBar bar("playing");
  while (!host_.isDone()) {
    if (played() >= limit_) {
      isAtLimit_ = true;
      unmetWait_ = findUnmetWait();
      return;
    }
    const std::uint64_t count = std::min(kSamplesPerPoll, limit_ - played());
    raiseTriggersBefore(played() + count);
    host_.play(count, recording_);
    bar.show(static_cast<double>(played()) / static_cast<double>(limit_));
  }
}

void Play::raiseTriggersBefore(std::uint64_t sample) {
  for (; recording_.triggers.size() < triggers_.size(); recording_.triggers.push_back(nextTrigger())) {
    if (nextTrigger().sample >= sample) return;
    host_.raiseTrigger(nextTrigger().trigger, nextTrigger().sample);
  }
}

void Play::forgetLateTriggers() {
  std::erase_if(recording_.triggers, [this](const TriggerEvent& event) { return event.sample >= played(); });
}

std::optional<UnmetWait> Play::findUnmetWait() const {
  const ktSim_State state = host_.state();
  if (state.address >= program_.origins.size()) return std::nullopt;
  const ktorba::InstructionOrigin& origin = program_.origins[state.address];
  if (origin.part != Part::kFetch) return std::nullopt;
  if (state.waitingForTrigger != 0) return UnmetWait{state.address, state.waitingForTrigger, false};
  const unsigned trigger = program_.entry.script.blocks[origin.block].triggerNumber;
  if (trigger == 0) return std::nullopt;
  std::size_t address = state.address;
  while (program_.origins[address].part != Part::kLoopStart) --address;
  return UnmetWait{address, trigger, true};
}

Diagnostic Play::diagnose(const UnmetWait& wait) const {
  return {Diagnostic::Severity::kWarning, program_.places[wait.address],
          "At the limit of " + formatCount(limit_) + " samples, " + wait.describe(),
          "Raise it with --trigger " + ktorba::triggerName(wait.trigger) + "@WHEN, or play longer with --limit."};
}

void Play::locate(Diagnostic& diagnostic) const {
  const std::uint32_t address = host_.state().address;
  if (address < program_.places.size()) diagnostic.place = program_.places[address];
}

}  // namespace tools::cli
