#include "testing/ReferencePlayer.h"

namespace scripts {
namespace {

using namespace ktwfmscriptcompiler;

// Thrown when the limit is reached, out of however many loops are open.
struct LimitReached {};

struct Player {
  Played play(const NamedProcedure& script) {
    try {
      hold(minFetchSamples, {});  // the opening wait ends on a trigger that starting latches
      playAll(script);
      hold(minFetchSamples, {});
      played.isDone = true;
    } catch (const LimitReached&) {
    }
    return std::move(played);
  }

  void playAll(const InstructionContainer& container) {
    for (const auto& instruction : container.instructions) playOne(instruction);
  }

  void playOne(const Instruction& instruction) {
    if (const auto* clear = dynamic_cast<const ClearInstruction*>(&instruction)) {
      pendingClears.insert(pendingClears.end(), clear->triggers.begin(), clear->triggers.end());
      return;
    }
    applyClears();  // they act as the next instruction begins
    if (const auto* generate = dynamic_cast<const GenerateInstruction*>(&instruction)) {
      playGenerate(*generate);
    } else if (const auto* wait = dynamic_cast<const WaitInstruction*>(&instruction)) {
      playWait(*wait);
    } else {
      playRepeat(dynamic_cast<const RepeatInstruction&>(instruction));
    }
  }

  void playGenerate(const GenerateInstruction& generate) {
    const Samples& samples = waveforms.find(generate.waveformName)->second;
    const std::uint32_t start = generate.subset ? generate.subset->startOffset : 0;
    const std::uint32_t length = generate.subset ? generate.subset->length : static_cast<std::uint32_t>(samples.size());
    const std::vector<std::uint8_t> markers = markerMasks(generate, length);
    for (std::uint32_t i = 0; i < length; ++i) emit(samples[start + i], markers[i]);
  }

  void playWait(const WaitInstruction& wait) {
    if (wait.waitType == WaitType::kCounted) {
      hold(wait.sampleCount, markerMasks(wait, wait.sampleCount));
      return;
    }
    do {
      hold(minFetchSamples, {});
    } while (!isLatched(wait.trigger));
  }

  void playRepeat(const RepeatInstruction& repeat) {
    for (std::uint32_t pass = 0; repeat.repeatType != RepeatType::kCounted || pass < repeat.iterationCount; ++pass) {
      playAll(repeat);
      if (repeat.repeatType == RepeatType::kUntilTrigger && isLatched(repeat.trigger)) break;
    }
  }

  static std::vector<std::uint8_t> markerMasks(const FetchInstruction& fetch, std::uint32_t length) {
    std::vector<std::uint8_t> masks(length);
    for (const auto& marker : fetch.markers) {
      for (const std::uint32_t position : marker.positions) {
        masks[position] = static_cast<std::uint8_t>(masks[position] | 1u << marker.markerNumber);
      }
    }
    return masks;
  }

  void hold(std::uint32_t count, const std::vector<std::uint8_t>& markers) {
    const std::uint32_t held = played.samples.empty() ? 0 : played.samples.back();
    for (std::uint32_t i = 0; i < count; ++i) emit(held, markers.empty() ? std::uint8_t{0} : markers[i]);
  }

  void emit(std::uint32_t sample, std::uint8_t marker) {
    if (played.samples.size() == limit) throw LimitReached{};
    played.samples.push_back(sample);
    played.markers.push_back(marker);
  }

  bool isLatched(std::uint32_t trigger) const {
    for (const TriggerEvent& event : events) {
      if (event.tableNumber == trigger && event.sample <= played.samples.size()) return true;
    }
    return false;
  }

  // Forgets what has been latched so far; later events still come.
  void applyClears() {
    for (const std::uint32_t trigger : pendingClears) {
      std::erase_if(events, [&](const TriggerEvent& event) {
        return event.tableNumber == trigger && event.sample <= played.samples.size();
      });
    }
    pendingClears.clear();
  }

  const Waveforms& waveforms;
  std::uint32_t minFetchSamples;
  std::vector<TriggerEvent> events;
  std::uint64_t limit;
  std::vector<std::uint32_t> pendingClears{};
  Played played{};
};

}  // namespace

Played play(const NamedProcedure& script, const Waveforms& waveforms, std::uint32_t minFetchSamples,
            const std::vector<TriggerEvent>& events, std::uint64_t limit) {
  return Player{waveforms, minFetchSamples, events, limit}.play(script);
}

}  // namespace scripts
