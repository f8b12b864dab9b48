#include "cli/commands/SimulatedPlay.h"

#include <algorithm>

#include "cli/console.h"
#include "conventions/conventions.h"
#include "tools/player/BlockPlayer.h"
#include "tools/text/quantities.h"

namespace tools::cli {
namespace {

// Samples between two looks at the generator while nobody takes them; a long wait among them takes no time.
constexpr std::uint64_t kSamplesPerLook = 1u << 28;
// The simulated generator takes as many again while these wait.
constexpr std::size_t kMostTriggersAtOnce = 2048;

}  // namespace

SimulatedPlay::SimulatedPlay(const GeneratorOptions& generator, const LoadedScript& loaded,
                             const ComputedPlay& expected)
    : loaded_(loaded), expected_(expected), length_(expected.header().sampleCount), host_(generator) {}

void SimulatedPlay::perform(Outputs& outputs) {
  for (const NamedWaveform& named : loaded_.waveforms) host_.writeWaveform(named.name, named.waveform.samples);
  host_.writeScript(loaded_.file.text());
  host_.selectScript(expected_.scriptName());
  const RecordingParts wanted = outputs.wanted();
  BlockPlayer player(host_, expected_.header().sampleWidthBits, wanted);
  ProgressBar bar(wanted.any() ? "writing" : "playing");
  host_.start();
  std::uint64_t played = 0;
  while (!host_.isDone() && played < length_) {
    if (wanted.any() && !outputs.wanted().any()) return;
    const std::uint64_t wait = wanted.any() ? 0 : certainWait(played);
    if (wait != 0) {
      played += host_.play(wait, nullptr, nullptr);
    } else {
      const std::uint64_t count = nextCount(played, wanted.any() ? BlockPlayer::kMostSamples : kSamplesPerLook);
      played += player.play(played, count, [&outputs](const RecordingBlock& block) { outputs.take(block); });
    }
    bar.show(static_cast<double>(played) / static_cast<double>(length_));
  }
  requireAgreement(played);
}

// How many samples to play now: up to `most`, not beyond the end, nor more triggers than can wait. Those that come in
// them are raised.
std::uint64_t SimulatedPlay::nextCount(std::uint64_t played, std::uint64_t most) {
  const std::vector<TriggerEvent>& triggers = expected_.header().triggers;
  std::uint64_t end = played + std::min(most, length_ - played);
  const std::size_t tooMany = raised_ + kMostTriggersAtOnce;
  if (tooMany < triggers.size()) end = std::min(end, std::max(played + 1, triggers[tooMany].sample));
  for (; raised_ < triggers.size() && triggers[raised_].sample < end; ++raised_) {
    host_.raiseTrigger(triggers[raised_].trigger, triggers[raised_].sample);
  }
  return end - played;
}

// The samples until the next trigger, or the end, when the program now waits for one that has not come: nothing fires
// in them.
std::uint64_t SimulatedPlay::certainWait(std::uint64_t played) const {
  const std::vector<TriggerEvent>& triggers = expected_.header().triggers;
  const ktSim_State state = host_.state();
  if (state.waitingForTrigger == 0) return 0;
  if ((state.triggerLatches & ktorba::clearFlagOf(state.waitingForTrigger)) != 0) return 0;
  const std::uint64_t next = raised_ < triggers.size() ? triggers[raised_].sample : length_;
  return next - played;
}

void SimulatedPlay::requireAgreement(std::uint64_t played) {
  const bool isDone = host_.isDone();
  if (played == length_ && isDone == (expected_.ending() == PlayEnding::kEnd)) {
    if (!isDone) host_.abort();
    return;
  }
  throw CallFailure({.message = "Internal error: " + formatCount(length_) +
                                " samples were computed, and the generator " +
                                (isDone ? "ended after " : "plays on after ") + formatCount(played),
                     .help = "Please report it, with the script and the lengths of its waveforms."});
}

void SimulatedPlay::locate(Diagnostic& diagnostic) const {
  const std::uint32_t address = host_.state().address;
  const std::vector<Place>& places = expected_.program().places;
  if (address < places.size()) diagnostic.place = places[address];
}

}  // namespace tools::cli
