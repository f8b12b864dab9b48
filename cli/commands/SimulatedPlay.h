// The play of one program on a simulated generator, from the first call to the last. One thread; what it is made from
// must outlive it.
#pragma once

#include <cstdint>
#include <vector>

#include "cli/LoadedScript.h"
#include "cli/commands/ComputedPlay.h"
#include "tools/outputs/Output.h"
#include "tools/player/Host.h"

namespace tools::cli {

class SimulatedPlay {
 public:
  SimulatedPlay(const GeneratorOptions& generator, const LoadedScript& loaded, const ComputedPlay& expected);

  // Plays it for the outputs, which are open, or without its samples where there are none. Throws CallFailure, also
  // when what plays is not as long as computed.
  void perform(Outputs& outputs);

  // Adds the place in the script of the instruction at which a failed play stopped.
  void locate(Diagnostic& diagnostic) const;

 private:
  std::uint64_t playNext(Outputs& outputs, std::uint64_t played);
  std::uint64_t nextCount(std::uint64_t played, std::uint64_t most);
  std::uint64_t certainWait(std::uint64_t played) const;
  void requireAgreement(std::uint64_t played);

  const LoadedScript& loaded_;
  const ComputedPlay& expected_;
  std::uint64_t length_;  // expected, samples
  Host host_;
  std::size_t raised_ = 0;  // of the expected triggers
};

}  // namespace tools::cli
