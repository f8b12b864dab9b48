// A script and its waveforms, read and compiled for a generator: what every command but check starts from.
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "tools/program/ProgramBuilder.h"
#include "tools/sources/Source.h"

namespace tools::cli {

struct NamedWaveform {
  std::string name;    // as the script writes it
  std::string source;  // as the user gave it
  LoadedWaveform waveform;
};

struct LoadedScript {
  LoadedScript(ScriptFile script, const GeneratorOptions& options) : file(std::move(script)), builder(options) {}

  ScriptFile file;
  ProgramBuilder builder;
  std::vector<NamedWaveform> waveforms;  // those that the scripts play, in the order of their first use
  std::vector<Diagnostic> scriptWarnings;
  std::vector<std::string> notes;            // on what was taken from the sources
  std::vector<std::string> warnings;         // about what was given
  std::vector<std::string> unusedWaveforms;  // given, and played by none of the scripts

  // The programs, in text order; empty until they are built.
  std::vector<Program> programs;
};

// Reads and compiles the script, and loads the waveforms that it plays, of at most `maxSamples` each. Prints what is
// wrong and returns null when it does not compile or a waveform is missing. Throws Refusal for unusable sources.
std::unique_ptr<LoadedScript> loadScript(const std::string& scriptPath, const WaveformOptions& waveforms,
                                         const GeneratorOptions& generator, std::uint64_t maxSamples);

// Prints the notes too, in front. Returns whether there were any warnings.
bool printWarnings(const LoadedScript& loaded);

// Throws Refusal where one of the outputs is a file that the run reads: the script, or the source of a waveform.
void refuseSources(const std::vector<std::string>& outputs, const std::string& scriptPath,
                   const WaveformOptions& waveforms, const LoadedScript& loaded);

// Places the waveforms in memory and builds the programs; prints what is wrong and returns false when that fails.
// Throws Refusal for the first waveform that has no place.
bool buildPrograms(LoadedScript& loaded);

// The program of that name, the last of several as in a session; where `name` is empty, of the only name. Throws
// Refusal.
const Program& findProgram(const LoadedScript& loaded, const std::string& name);

}  // namespace tools::cli
