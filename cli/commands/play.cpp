#include <algorithm>
#include <filesystem>
#include <memory>

#include "cli/LoadedScript.h"
#include "cli/commands/commands.h"
#include "cli/commands/report.h"
#include "cli/console.h"
#include "ktorba/hwRecords/conventions.h"
#include "platform/system/clock.h"
#include "platform/system/terminal.h"
#include "tools/outputs/Output.h"
#include "tools/player/Host.h"
#include "tools/player/simulatedGenerator.h"
#include "tools/program/listing.h"
#include "tools/recording/Recording.h"
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

enum class Ending { kDone, kLimit, kInterrupt };

// One play of one program, from the first call to the last.
class Play {
 public:
  Play(const PlayOptions& options, const LoadedScript& loaded, const Program& program)
      : options_(options),
        loaded_(loaded),
        program_(program),
        triggers_(parseTriggers(options)),
        limit_(parseLimit(options)) {
    recording_.title = options.title.empty()
                           ? std::filesystem::path(options.script).filename().string() + " \u2014 " + scriptName()
                           : options.title;
    recording_.sampleRateHz = options.generator.sampleRateHz;
    recording_.samples = SampleBuffer(options.generator.sampleWidthBits);
    recording_.samples.reserve(std::min(limit_, kMostReserved));
    for (std::size_t address = 0; address < program.origins.size(); ++address) {
      recording_.program.push_back(describeInstruction(program, address));
    }
  }

  void run() {
    for (const NamedWaveform& named : loaded_.waveforms) host_.writeWaveform(named.name, named.waveform.samples);
    host_.writeScript(loaded_.file.text());
    host_.selectScript(scriptName());
    host_.start();
    pollToTheEnd();
    if (ending_ != Ending::kDone) host_.abort();
  }

  const Recording& recording() const { return recording_; }
  Ending ending() const { return ending_; }
  std::uint64_t limit() const { return limit_; }
  const std::string& scriptName() const { return program_.entry.script.name; }

  // What an unfinished program waits for; nothing when it simply plays on.
  std::optional<Diagnostic> findUnmetWait() const { return unmetWait_; }

  // The place in the script of the instruction at which a failed play stopped.
  void locate(Diagnostic& diagnostic) const {
    const std::uint32_t address = host_.state().address;
    if (address >= program_.places.size()) return;
    diagnostic.place = program_.places[address];
  }

 private:
  std::uint64_t played() const { return recording_.samples.size(); }

  void pollToTheEnd() {
    ProgressBar bar("playing");
    while (!host_.isDone()) {
      if (platform::wasInterrupted()) return stop(Ending::kInterrupt);
      if (played() >= limit_) return stop(Ending::kLimit);
      const std::uint64_t count = std::min(kSamplesPerPoll, limit_ - played());
      raiseTriggersBefore(played() + count);
      host_.play(count, recording_);
      bar.show(static_cast<double>(played()) / static_cast<double>(limit_));
    }
    forgetLateTriggers();
  }

  void stop(Ending ending) {
    ending_ = ending;
    if (ending == Ending::kLimit) unmetWait_ = describeUnmetWait();
    forgetLateTriggers();
  }

  void raiseTriggersBefore(std::uint64_t sample) {
    for (; recording_.triggers.size() < triggers_.size(); recording_.triggers.push_back(nextTrigger())) {
      if (nextTrigger().sample >= sample) return;
      host_.raiseTrigger(nextTrigger().trigger, nextTrigger().sample);
    }
  }
  const TriggerEvent& nextTrigger() const { return triggers_[recording_.triggers.size()]; }

  void forgetLateTriggers() {
    std::erase_if(recording_.triggers, [this](const TriggerEvent& event) { return event.sample >= played(); });
  }

  std::optional<Diagnostic> describeUnmetWait() const {
    const ktSim_State state = host_.state();
    if (state.address >= program_.origins.size()) return std::nullopt;
    const ktorba::InstructionOrigin& origin = program_.origins[state.address];
    if (origin.part != Part::kFetch) return std::nullopt;
    const auto& block = program_.entry.script.blocks[origin.block];
    unsigned trigger = state.waitingForTrigger;
    std::size_t address = state.address;
    if (trigger == 0 && block.triggerNumber != 0) {
      trigger = block.triggerNumber;
      while (program_.origins[address].part != Part::kLoopStart) --address;
    }
    return trigger == 0 ? std::nullopt : std::optional(tellUnmetWait(address, trigger));
  }

  Diagnostic tellUnmetWait(std::size_t address, unsigned trigger) const {
    const std::string name = ktorba::triggerName(trigger);
    return {Diagnostic::Severity::kWarning, program_.places[address],
            "At the limit of " + formatCount(limit_) + " samples, instruction " + std::to_string(address) +
                (program_.origins[address].part == Part::kLoopStart ? " still repeats until " : " still waits for ") +
                name,
            "Raise it with --trigger " + name + "@WHEN, or play longer with --limit."};
  }

  const PlayOptions& options_;
  const LoadedScript& loaded_;
  const Program& program_;
  std::vector<TriggerEvent> triggers_;  // to raise, ascending; those raised so far are in the recording
  std::uint64_t limit_;                 // samples
  Host host_{options_.generator};
  Recording recording_;
  Ending ending_ = Ending::kDone;
  std::optional<Diagnostic> unmetWait_;
};

std::string describeMarkers(const Recording& recording) {
  std::string text;
  for (const unsigned marker : usedMarkers(recording)) {
    const unsigned bit = ktorba::markerBitOf(marker);
    const auto count =
        std::ranges::count_if(recording.markers, [bit](const MarkerEvent& event) { return (event.mask & bit) != 0; });
    text += (text.empty() ? "" : ", ") + ktorba::markerName(marker) + " \u00d7 " +
            formatCount(static_cast<std::uint64_t>(count));
  }
  return text.empty() ? "none fired" : text;
}

std::string describeTriggers(const Recording& recording) {
  constexpr std::size_t kMostListed = 8;
  std::string text;
  for (std::size_t i = 0; i < std::min(kMostListed, recording.triggers.size()); ++i) {
    const TriggerEvent& event = recording.triggers[i];
    text += (i == 0 ? "" : ", ") + ktorba::triggerName(event.trigger) + " at " +
            formatQuantity(static_cast<double>(event.sample) / recording.sampleRateHz, "s");
  }
  if (recording.triggers.size() > kMostListed) {
    text += " and " + formatCount(recording.triggers.size() - kMostListed) + " more";
  }
  return text.empty() ? "none raised" : text;
}

std::string describeClipping(const LoadedScript& loaded) {
  std::uint64_t clipped = 0;
  for (const NamedWaveform& named : loaded.waveforms) clipped += named.waveform.clippedSamples;
  return clipped == 0 ? "none" : formatCount(clipped) + " samples of the waveforms";
}

std::string describeEnding(const Play& play) {
  if (play.ending() == Ending::kInterrupt) return ", interrupted";
  if (play.ending() == Ending::kLimit) return ", stopped at the limit";
  return ", to the end";
}

void printSummary(const Play& play, const LoadedScript& loaded, const Program& program, const PlayOptions& options,
                  std::uint64_t tookMs) {
  const Recording& recording = play.recording();
  const std::size_t scripts = loaded.programs.size();
  printRow("script", play.scriptName() + (scripts == 1 ? "" : ", one of " + std::to_string(scripts)) + ": " +
                         formatCount(program.entry.instructionWords.size()) + " of " +
                         formatCount(options.generator.sequenceWords) + " instructions");
  printRow("memory", formatCount(loaded.builder.usedBytes()) + " of " + formatCount(options.generator.memorySizeBytes) +
                         " bytes of samples");
  printRow("played", formatCount(recording.samples.size()) + " samples, " +
                         formatQuantity(static_cast<double>(recording.samples.size()) / recording.sampleRateHz, "s") +
                         " at " + formatQuantity(recording.sampleRateHz, "S/s") + describeEnding(play));
  printRow("markers", describeMarkers(recording));
  printRow("triggers", describeTriggers(recording));
  printRow("clipped", describeClipping(loaded));
  for (const std::string& output : options.outputs) printRow("wrote", output);
  printRow("took", formatQuantity(static_cast<double>(tookMs) / 1000, "s"));
}

}  // namespace

int play(const PlayOptions& options) {
  const std::uint64_t startMs = platform::monotonicMilliseconds();
  platform::catchInterrupts();
  checkOptions(options.generator);
  for (const std::string& output : options.outputs) {
    checkOutput(output, options.generator.sampleWidthBits, options.generator.sampleRateHz);
  }
  const auto loaded =
      loadScript(options.script, options.waveforms, options.generator, options.generator.memorySamples());
  if (!loaded) return kFailure;
  if (printWarnings(*loaded) && options.isStrict) return kFailure;
  if (!buildPrograms(*loaded)) return kFailure;
  const Program& program = findProgram(*loaded, options.name);

  std::unique_ptr<Play> running;
  try {
    running = std::make_unique<Play>(options, *loaded, program);
    running->run();
  } catch (CallFailure& failure) {
    if (running && !failure.diagnostic.place.isKnown()) running->locate(failure.diagnostic);
    printDiagnostic(failure.diagnostic, loaded->file);
    return kFailure;
  }
  for (const std::string& output : options.outputs) writeOutput(output, running->recording());
  if (const auto wait = running->findUnmetWait()) printDiagnostic(*wait, loaded->file);
  printSummary(*running, *loaded, program, options, platform::monotonicMilliseconds() - startMs);
  return running->ending() == Ending::kInterrupt ? kFailure : kSuccess;
}

}  // namespace tools::cli
