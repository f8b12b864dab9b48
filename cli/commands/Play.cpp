#include "cli/commands/Play.h"

#include <algorithm>

#include "cli/console.h"
#include "conventions/conventions.h"
#include "ktorba/script/instructionDecoder.h"
#include "platform/system/paths.h"
#include "tools/player/BlockPlayer.h"
#include "tools/text/Refusal.h"
#include "tools/text/quantities.h"
#include "tools/timeline/raisedTriggers.h"

namespace tools::cli {
namespace {

// Samples between two looks at the generator while nobody takes them; a long wait among them takes no time.
constexpr std::uint64_t kSamplesPerLook = 1u << 28;
// The simulated generator takes as many again while these wait.
constexpr std::size_t kMostTriggersAtOnce = 2048;

using Part = ktorba::InstructionOrigin::Part;

std::vector<TriggerEvent> parseTriggers(const PlayOptions& options) {
  std::vector<TriggerEvent> triggers;
  for (const auto& [sample, trigger] : readTriggers(options.triggers, options.generator.sampleRateHz)) {
    triggers.push_back({sample, trigger});
  }
  return triggers;
}

std::uint64_t parseLimit(const PlayOptions& options) {
  const auto limit = parseSampleCount(options.limit, options.generator.sampleRateHz);
  if (!limit || *limit == 0) {
    throw Refusal("--limit: \"" + options.limit + "\" is neither a number of samples nor a time");
  }
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

bool hasMarkers(const Program& program) {
  return std::ranges::any_of(program.entry.instructionWords, [](const auto& words) {
    const auto instruction = ktorba::decodeInstruction(words);
    return instruction.is(ktorba::Opcode::kFetch) && instruction[ktorba::fetch_field::kMarkerMask] != 0;
  });
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
  header_.title = options.title.empty()
                      ? platform::toText(platform::toPath(loaded.file.name()).filename()) + " \u2014 " + scriptName()
                      : options.title;
  header_.sampleRateHz = options.generator.sampleRateHz;
  header_.sampleWidthBits = options.generator.sampleWidthBits;
  for (std::size_t address = 0; address < program.origins.size(); ++address) {
    header_.program.push_back(describeInstruction(program, address));
  }
}

void Play::rehearse(const std::function<void(const RecordingHeader&)>& watch) {
  for (const NamedWaveform& named : loaded_.waveforms) host_.writeWaveform(named.name, named.waveform.samples);
  host_.writeScript(loaded_.file.text());
  host_.selectScript(scriptName());
  const RecordingParts wanted = {.markers = hasMarkers(program_)};
  const std::uint64_t most = wanted.markers ? BlockPlayer::kMostSamples : kSamplesPerLook;
  ProgressBar bar("playing");
  BlockPlayer player(host_, header_.sampleWidthBits, wanted);
  start();
  std::uint64_t watched = 1;
  while (!isOver(header_.sampleCount)) {
    std::uint64_t& played = header_.sampleCount;
    const std::uint64_t wait = certainWait(played);
    if (wait != 0) {
      played += host_.play(wait, nullptr, nullptr);
    } else {
      played += player.play(played, nextCount(played, most), [this](const RecordingBlock& block) { note(block); });
    }
    if (played >= watched) {
      watch(header_);
      watched = 2 * played;
    }
    bar.show(static_cast<double>(header_.sampleCount) / static_cast<double>(limit_));
  }
  end();
  for (const TriggerEvent& event : triggers_) {
    if (event.sample < header_.sampleCount) header_.triggers.push_back(event);
  }
}

void Play::perform(Outputs& outputs) {
  ProgressBar bar("writing");
  BlockPlayer player(host_, header_.sampleWidthBits, outputs.wanted());
  start();
  std::uint64_t played = 0;
  while (outputs.wanted().any() && !isOver(played)) {
    const std::uint64_t count = nextCount(played, BlockPlayer::kMostSamples);
    played += player.play(played, count, [&outputs](const RecordingBlock& block) { outputs.take(block); });
    bar.show(static_cast<double>(played) / static_cast<double>(header_.sampleCount));
  }
  if (outputs.wanted().any() && played != header_.sampleCount) {
    throw CallFailure({.message = "The generator played " + formatCount(header_.sampleCount) + " samples, and " +
                                  formatCount(played) + " when it played the same again"});
  }
}

void Play::start() {
  raised_ = 0;
  host_.start();
}

bool Play::isOver(std::uint64_t played) { return host_.isDone() || played >= limit_; }

// How many samples to play now: up to `most`, not beyond the limit, nor more triggers than can wait. Those that come in
// them are raised.
std::uint64_t Play::nextCount(std::uint64_t played, std::uint64_t most) {
  std::uint64_t end = played + std::min(most, limit_ - played);
  const std::size_t tooMany = raised_ + kMostTriggersAtOnce;
  if (tooMany < triggers_.size()) end = std::min(end, std::max(played + 1, triggers_[tooMany].sample));
  for (; raised_ < triggers_.size() && triggers_[raised_].sample < end; ++raised_) {
    host_.raiseTrigger(triggers_[raised_].trigger, triggers_[raised_].sample);
  }
  return end - played;
}

// The samples until the next trigger, or the limit, when the program now waits for one that has not come: nothing fires
// in them.
std::uint64_t Play::certainWait(std::uint64_t played) const {
  const ktSim_State state = host_.state();
  if (state.waitingForTrigger == 0) return 0;
  if ((state.triggerLatches & ktorba::clearFlagOf(state.waitingForTrigger)) != 0) return 0;
  const std::uint64_t next = raised_ < triggers_.size() ? triggers_[raised_].sample : limit_;
  return std::min(next, limit_) - played;
}

void Play::note(const RecordingBlock& block) {
  for (const MarkerEvent& event : block.markers) {
    header_.markerMask |= event.mask;
    for (unsigned marker = 0; marker < ktorba::kMarkerCount; ++marker) {
      if ((event.mask & ktorba::markerBitOf(marker)) != 0) ++firings_[marker];
    }
  }
}

void Play::end() {
  isAtLimit_ = !host_.isDone();
  if (!isAtLimit_) return;
  unmetWait_ = findUnmetWait();
  host_.abort();
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
