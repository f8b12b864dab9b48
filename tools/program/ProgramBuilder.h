// Compiles scripts for a generator as a session would, without one: waveforms are placed in its memory, scripts become
// instruction words, and every word knows the place in the script that it comes from.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "ktWfmScriptCompiler/SourceMap.h"
#include "kterr/Exception.h"
#include "ktorba/script/ScriptProcessor.h"
#include "ktorba/script/SequenceInstructionsGenerator.h"
#include "ktorba/waveform/MemoryBlockManager.h"
#include "ktorba/waveform/WaveformStore.h"
#include "ktorba/waveform/WaveformTable.h"
#include "tools/diagnostics/Diagnostic.h"
#include "tools/program/GeneratorOptions.h"
#include "tools/text/Refusal.h"

namespace tools {

// One script as instruction words; origins and places run in parallel with entry.instructionWords.
struct Program {
  ktorba::ScriptEntry entry;  // with its script
  std::vector<ktorba::InstructionOrigin> origins;
  std::vector<Place> places;  // of the script's keyword for its start, end and jump

  // The fetch that a word comes from; null for words that are no fetch of the script.
  const ktorba::FetchRecord* fetchOf(std::size_t address) const;
};

struct WaveformLength {
  std::string name;
  std::uint64_t samples = 0;
};

class ProgramBuilder {
 public:
  explicit ProgramBuilder(const GeneratorOptions& options);

  // Compiles without waveforms. Returns the number of scripts; 0 with the errors of the text in `diagnostics`. `file`
  // must outlive this object.
  std::size_t compile(const ScriptFile& file, std::vector<Diagnostic>& diagnostics);

  // The names of the waveforms that the compiled scripts play, each once, in the order of their first use.
  std::vector<std::string> usedWaveforms() const;

  // Adds one error, at its first use, for each used waveform that is not among the given names, with a near miss among
  // those on offer.
  void checkWaveformsAreThere(const std::vector<std::string>& given, const std::vector<std::string>& onOffer,
                              std::vector<Diagnostic>& diagnostics) const;

  // Places a waveform in memory as a session does. Throws Refusal when the name, the length or the memory does not
  // allow it.
  const ktorba::WaveformEntry& addWaveform(const std::string& name, std::uint64_t sampleCount);

  // Makes a refused waveform known, at offset 0 and without memory, so that what plays it can still be counted.
  void addUnplacedWaveform(const std::string& name, std::uint64_t sampleCount);

  // Turns the compiled scripts into words. Leaves out scripts that cannot be built and adds an error for each, at most
  // kMaxErrors: there it stops.
  std::vector<Program> build(std::vector<Diagnostic>& diagnostics);

  const ktorba::HWTraits& traits() const { return traits_; }
  const ktorba::WaveformTable<ktorba::WaveformEntry>& waveforms() const { return waveforms_; }
  std::uint64_t usedBytes() const { return usedBytes_; }  // of sample memory, whole words
  std::uint32_t largestFreeBytes() const { return memory_.getLargestAvailableBlockSize(); }

 private:
  Refusal refusalOf(const std::string& name, std::uint64_t sampleCount, const kterr::Exception& error) const;
  Program buildScript(std::size_t script);
  std::vector<Place> placesOf(std::size_t script, const std::vector<ktorba::InstructionOrigin>& origins) const;
  Place findCulprit(std::size_t script);

  double sampleRateHz_;
  ktorba::HWTraits traits_;
  ktwfmscriptcompiler::ScriptTraits scriptTraits_;
  ktorba::SequenceInstructionsGenerator encoder_;
  ktorba::ScriptProcessor processor_;
  ktorba::WaveformTable<ktorba::WaveformEntry> waveforms_;
  ktorba::MemoryBlockManager memory_;
  ktorba::WaveformStore store_{traits_, waveforms_, memory_};
  std::uint64_t usedBytes_ = 0;
  const ScriptFile* file_ = nullptr;
  std::vector<ktorba::CompiledScript> scripts_;
  ktwfmscriptcompiler::SourceMap map_;
};

}  // namespace tools
