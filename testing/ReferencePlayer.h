// Plays a script straight from its parse tree, sample by sample, with no knowledge of instruction words: what the
// library and the generator together have to produce. Written for plainness, not for speed.
#pragma once

#include <cstdint>
#include <map>
#include <string>
#include <vector>

#include "ktWfmScriptCompiler/ParseTree.h"
#include "ktcheckname/compareNames.h"

namespace scripts {

using Samples = std::vector<std::uint32_t>;
using Waveforms = std::map<std::string, Samples, ktcheckname::NameLess>;

// A trigger of the script language, by table number (trigger1 is 0), latched once `sample` samples have been played.
struct TriggerEvent {
  std::uint32_t tableNumber;
  std::uint64_t sample;
};

struct Played {
  Samples samples;
  std::vector<std::uint8_t> markers;  // one mask per sample
  bool isDone = false;                // the script came to its end within the limit
};

// Plays `script` up to `limit` samples. `minFetchSamples` is the length of the waits that open and close every script
// and of one pass of a wait until a trigger.
Played play(const ktwfmscriptcompiler::NamedProcedure& script, const Waveforms& waveforms,
            std::uint32_t minFetchSamples, const std::vector<TriggerEvent>& events, std::uint64_t limit);

}  // namespace scripts
