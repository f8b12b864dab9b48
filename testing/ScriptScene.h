// A generator's traits, some waveforms in its sample memory, and a script processor over both.
#pragma once

#include <string>
#include <vector>

#include "ktorba/script/ScriptProcessor.h"
#include "ktorba/script/SequenceInstructionsGenerator.h"
#include "ktorba/waveform/MemoryBlockManager.h"
#include "ktorba/waveform/WaveformTable.h"

namespace ktorba {

struct SceneNumbers {
  std::uint8_t sampleWidthBits = 16;
  std::uint32_t samplesPerMemoryWord = 8;
  std::uint32_t minFetchSamples = 64;
  std::uint32_t alignmentQuantum = 1;
};

struct BuiltScript {
  CompiledScript script;
  ScriptEntry entry;
  std::vector<InstructionOrigin> origins;
};

class ScriptScene {
 public:
  explicit ScriptScene(const SceneNumbers& numbers = {});

  // Places the waveform in memory as the facade does: in whole memory words.
  WaveformEntry& addWaveform(const std::string& name, std::uint32_t samples);
  BuiltScript build(const CompiledScript& script);
  std::vector<BuiltScript> build(const std::string& text);

  SceneNumbers numbers;
  ktwfmscriptcompiler::ScriptTraits scriptTraits;
  SequenceInstructionsGenerator encoder;
  ScriptProcessor processor;
  WaveformTable<WaveformEntry> waveforms;
  MemoryBlockManager memory;

 private:
  BuiltScript latest_;
};

// Whether the program plays the script: every fetch with its samples, in order, in pieces long enough, every marker at
// its absolute position, every loop around its body, and totalMemoryWords as the decoded instructions add up. Returns
// an empty text, or what is wrong first.
std::string findFault(const BuiltScript& built, ScriptScene& scene);

}  // namespace ktorba
