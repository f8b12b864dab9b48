// One play of one program on a simulated generator, from the first call to the last. One thread; what it is made from
// must outlive it.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "cli/LoadedScript.h"
#include "cli/commands/commands.h"
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

  // Throws CallFailure.
  void run();

  const Recording& recording() const { return recording_; }
  const std::string& scriptName() const { return program_.entry.script.name; }
  bool isAtLimit() const { return isAtLimit_; }

  // Nothing when the program has ended or simply plays on.
  const std::optional<UnmetWait>& unmetWait() const { return unmetWait_; }
  Diagnostic diagnose(const UnmetWait& wait) const;

  // Adds the place in the script of the instruction at which a failed play stopped.
  void locate(Diagnostic& diagnostic) const;

 private:
  std::uint64_t played() const { return recording_.samples.size(); }
  const TriggerEvent& nextTrigger() const { return triggers_[recording_.triggers.size()]; }
  void pollToTheEnd();
  void raiseTriggersBefore(std::uint64_t sample);
  void forgetLateTriggers();
  std::optional<UnmetWait> findUnmetWait() const;

  const LoadedScript& loaded_;
  const Program& program_;
  std::vector<TriggerEvent> triggers_;  // to raise, ascending; those raised so far are in the recording
  std::uint64_t limit_;                 // samples
  Host host_;
  Recording recording_;
  bool isAtLimit_ = false;
  std::optional<UnmetWait> unmetWait_;
};

}  // namespace tools::cli
