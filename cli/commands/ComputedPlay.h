// What a play, or a window of it, comes to, computed: its length, what fires and is raised in it, how it ends, and if
// wanted its samples. One thread; what it is made from must outlive it.
#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "cli/LoadedScript.h"
#include "cli/commands/commands.h"
#include "tools/outputs/Output.h"
#include "tools/recording/Recording.h"
#include "tools/timeline/Renderer.h"
#include "tools/timeline/Timeline.h"

namespace tools::cli {

// What an unfinished program waits for.
struct UnmetWait {
  std::size_t address;  // of the instruction
  unsigned trigger;     // hardware trigger
  bool isLoop;          // that repeats until the trigger comes

  // "instruction 6 still waits for trigger2".
  std::string describe() const;
};

enum class PlayEnding {
  kEnd,     // of the program
  kLimit,   // that was set, or that holds where none was
  kWindow,  // of what was asked for, before either
};

// The hardware triggers that a play asks for or clears, as clear flags.
unsigned triggersUsedBy(const StraightPlay& play);

// Throws Refusal for the first trigger raised that is not among those.
void requireUse(const std::vector<RaisedTrigger>& raised, unsigned used);

class ComputedPlay {
 public:
  // What is shown where neither a limit nor a length is given: ten million samples at most, as of a play; or all, and
  // of what has no end three rounds of what repeats at last.
  enum class Unlimited { kTenMillion, kWhatMatters };

  // Throws Refusal for triggers, limits and windows that are none, or lie outside the play.
  ComputedPlay(const WindowOptions& window, const GeneratorOptions& generator, const LoadedScript& loaded,
               const Program& program, Unlimited unlimited = Unlimited::kTenMillion);

  const Program& program() const { return program_; }
  const std::string& scriptName() const { return program_.entry.script.name; }
  const Timeline& timeline() const { return timeline_; }
  const TimelineWaveforms& waveforms() const { return waveforms_; }
  const std::vector<RaisedTrigger>& triggers() const { return triggers_; }  // all that were to be raised

  const RecordingHeader& header() const { return header_; }
  void setTitle(std::string title) { header_.title = std::move(title); }

  // The samples of the window at which a marker is high.
  std::uint64_t samplesAt(unsigned marker) const;
  PlayEnding ending() const { return ending_; }
  // What is waited for at the limit; nothing when the program has ended or simply plays on.
  const std::optional<UnmetWait>& unmetWait() const { return unmetWait_; }
  Diagnostic diagnose(const UnmetWait& wait) const;

  // Hands the window on to outputs, which are open. `show` is told how far it is, from 0 to 1.
  void perform(Outputs& outputs, const std::function<void(double)>& show) const;

 private:
  void chooseWindow(const WindowOptions& window);
  std::uint64_t limitOf(const WindowOptions& window, std::uint64_t first) const;
  std::uint64_t endOfWhatMatters(std::uint64_t first) const;
  std::string describeEnd(std::uint64_t end) const;
  std::optional<UnmetWait> findUnmetWait() const;

  const Program& program_;
  std::vector<RaisedTrigger> triggers_;
  Timeline timeline_;
  TimelineWaveforms waveforms_;
  RecordingHeader header_;
  Unlimited unlimited_;
  PlayEnding ending_ = PlayEnding::kEnd;
  std::optional<UnmetWait> unmetWait_;
};

}  // namespace tools::cli
