// Turns one compiled script into the words of its program: finds each waveform, checks offsets, lengths and markers
// against it, cuts fetches at their markers and has every instruction encoded. Used once, for one script; internal to
// script processing, whose front door is ScriptProcessor.
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "ktorba/script/InstructionOrigin.h"
#include "ktorba/script/ScriptTableInterface.h"
#include "ktorba/script/SequenceInstructionsGeneratorInterface.h"
#include "ktorba/waveform/WaveformTableInterface.h"

namespace ktorba {

class InstructionWordsBuilder {
 public:
  // Everything is borrowed for the builder's life. `origins` may be null; else it gets one element per word.
  InstructionWordsBuilder(SequenceInstructionsGeneratorInterface& encoder, std::uint32_t minFetchSamples,
                          const WaveformFinderInterface& finder, ScriptEntry& entry,
                          std::vector<InstructionOrigin>* origins);

  // Fills the entry, all but its script and isLoaded. Raises what ScriptProcessor::buildInstructionWords() does.
  void build(const CompiledScript& script);

 private:
  using Part = InstructionOrigin::Part;
  // Where a fetch finds its samples.
  struct Source {
    std::uint32_t address = 0;  // bytes
    std::uint32_t length = 0;   // samples
  };

  // A waveform looked up before, and the name in the script that it was looked up by.
  struct Found {
    std::string_view name;
    const WaveformEntry* waveform = nullptr;
  };

  void prepareEntry(const CompiledScript& script);
  void appendScriptStart();
  void appendScriptEnd(bool isEndless);
  void appendBlock(const SequenceBlock& block);
  std::uint64_t appendFetch(const FetchRecord& fetch);
  std::uint64_t appendPieces(const FetchRecord& fetch, const Source& source);
  std::uint32_t appendChecked(const FetchDescriptor& fetch);
  SequenceInstructionWords& appendWords(Part part);
  // What the instruction of `fetch` has no room for, in words; nothing where it fits.
  std::optional<std::string> findMisfit(const FetchDescriptor& fetch) const;
  Source resolve(const FetchRecord& fetch);
  Source resolveGenerate(const FetchRecord& fetch);
  const WaveformEntry& find(std::string_view name);

  SequenceInstructionsGeneratorInterface& encoder_;
  std::uint32_t minFetchSamples_;
  const WaveformFinderInterface& finder_;
  ScriptEntry& entry_;
  std::vector<InstructionOrigin>* origins_;
  std::vector<Found> found_;  // a power of two; each name has one place, where a later one replaces it
  std::uint32_t block_ = 0;   // being built: indices into the script, for origins
  std::uint32_t fetch_ = 0;
};

}  // namespace ktorba
