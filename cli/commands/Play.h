// The play of one program on a simulated generator, from the first call to the last. One thread; what it is made from
// must outlive it.
#pragma once

#include <array>
#include <cstdint>
#include <functional>
#include <optional>
#include <string>
#include <vector>

#include "cli/LoadedScript.h"
#include "cli/commands/commands.h"
#include "conventions/conventions.h"
#include "tools/outputs/Output.h"
#include "tools/player/Host.h"
#include "tools/recording/Recording.h"

namespace tools::cli {

// What an unfinished program waits for.
struct UnmetWait {
  std::size_t address;  // of the instruction
  unsigned trigger;     // hardware trigger
  bool isLoop;          // that repeats until the trigger comes

  // "instruction 6 still waits for trigger2".
  std::string describe() const;
};

class Play {
 public:
  // Throws Refusal for triggers and limits that are none.
  Play(const PlayOptions& options, const LoadedScript& loaded, const Program& program);

  // Plays it without its samples, to learn how long it is, what fires in it and how it ends: all that outputs have to
  // know before their first byte. Throws CallFailure, and what `watch` throws, which sees the header each
  // time that its length has doubled.
  void rehearse(const std::function<void(const RecordingHeader&)>& watch);
  // Plays it once more for the outputs, which are open.
  void perform(Outputs& outputs);

  // Since rehearse() of the whole play.
  const RecordingHeader& header() const { return header_; }
  std::uint64_t samplesAt(unsigned marker) const { return firings_[marker]; }
  bool isAtLimit() const { return isAtLimit_; }
  const std::vector<TriggerEvent>& triggers() const { return triggers_; }  // all that were asked for, ascending
  const std::string& scriptName() const { return program_.entry.script.name; }

  // Nothing when the program has ended or simply plays on.
  const std::optional<UnmetWait>& unmetWait() const { return unmetWait_; }
  Diagnostic diagnose(const UnmetWait& wait) const;

  // Adds the place in the script of the instruction at which a failed play stopped.
  void locate(Diagnostic& diagnostic) const;

 private:
  void start();
  bool isOver(std::uint64_t played);
  std::uint64_t nextCount(std::uint64_t played, std::uint64_t most);
  std::uint64_t certainWait(std::uint64_t played) const;
  void note(const RecordingBlock& block);
  void end();
  std::optional<UnmetWait> findUnmetWait() const;

  const LoadedScript& loaded_;
  const Program& program_;
  std::vector<TriggerEvent> triggers_;  // to raise, ascending
  std::uint64_t limit_;                 // samples
  Host host_;
  RecordingHeader header_;
  std::array<std::uint64_t, ktorba::kMarkerCount> firings_{};  // samples at which each marker is high
  std::size_t raised_ = 0;                                     // of triggers_, in the play under way
  bool isAtLimit_ = false;
  std::optional<UnmetWait> unmetWait_;
};

}  // namespace tools::cli
