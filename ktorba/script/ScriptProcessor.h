// The bridge between the script compiler and the sequencer: compiles script texts, and turns each compiled script into
// the words of its program against the waveforms there are. It owns one compiler and keeps nothing else
// between calls. One thread at a time.
#pragma once

#include <string>
#include <vector>

#include "ktWfmScriptCompiler/Compiler.h"
#include "ktorba/script/InstructionOrigin.h"
#include "ktorba/script/ScriptTableInterface.h"
#include "ktorba/script/SequenceInstructionsGeneratorInterface.h"
#include "ktorba/waveform/WaveformTableInterface.h"

namespace ktorba {

class ScriptProcessor {
 public:
  // Borrows traits and encoder, which must outlive it. `minFetchSamples` is the hardware's shortest fetch, in samples.
  ScriptProcessor(const ktwfmscriptcompiler::ScriptTraits& traits, SequenceInstructionsGeneratorInterface* encoder,
                  std::uint32_t minFetchSamples);
  ScriptProcessor(const ScriptProcessor&) = delete;
  ScriptProcessor& operator=(const ScriptProcessor&) = delete;

  // Replaces `scripts` with one record per script of `text`, in text order, and fills `map`, when there is one, with
  // where their parts stand in the text. Raises every error of the compiler and then leaves both alone.
  void compileScripts(const std::string& text, std::vector<CompiledScript>& scripts,
                      ktwfmscriptcompiler::SourceMap* map = nullptr);

  // Fills all of `entry` but its script and isLoaded; `origins`, when there is one, gets one element per word.
  // After a failure both are filled in part: discard them. Raises, for the first instruction that does not fit,
  //   ktorba_errors::kErrorSpecifiedWaveformNotFound: no waveform of that name,
  //   kErrorStartPositionExceedsWaveformLength, kErrorRequestedWaveformLengthIsTooSmall,
  //   kErrorRequestedWaveformLengthExceedsAllocatedLength, kErrorInvalidStartPositionAndWaveformLengthCombination: a
  //     subset that does not lie in its waveform; an offset without a length is the last of these,
  //   kErrorInvalidWaveformLengthToIgnore: a wait of more than 2147483647 samples,
  //   kErrorMarkerPositionExceedsLastElementInWaveform, kErrorInvalidNumberOfMarkersOnAWaveform,
  //   kErrorInvalidDistanceBetweenTwoMarkerPositions: markers that the sequencer cannot fire,
  //   kErrorInternalSWError: an unknown loop kind or trigger; with a message, a value that its instruction has no
  //     room for, as with memory words of more than 16 samples, or a trait that rules encoding out.
  void buildInstructionWords(const CompiledScript& script, const WaveformFinderInterface& waveforms, ScriptEntry& entry,
                             std::vector<InstructionOrigin>* origins = nullptr);

 private:
  ktwfmscriptcompiler::Compiler compiler_;
  SequenceInstructionsGeneratorInterface* encoder_;
  std::uint32_t minFetchSamples_;
};

}  // namespace ktorba
