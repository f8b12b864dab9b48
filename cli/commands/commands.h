// The tool's commands. Each prints its results and returns the exit code: 0, or 1 for errors in what it was given.
// Each throws Refusal for what it cannot work with at all.
#pragma once

#include <string>
#include <vector>

#include "tools/program/GeneratorOptions.h"
#include "tools/sources/Source.h"

namespace tools::cli {

inline constexpr int kSuccess = 0;
inline constexpr int kFailure = 1;
inline constexpr int kUsageError = 2;

struct CheckOptions {
  std::vector<std::string> scripts;
  bool isJson = false;
  bool isStrict = false;  // warnings count as errors
  bool isFixing = false;  // writes the certain fixes into the files
  GeneratorOptions generator;
};
int check(const CheckOptions& options);

struct DisassembleOptions {
  std::string script;
  std::string name;  // of the one script to show; empty: all
  bool asScript = false;
  bool isJson = false;
  WaveformOptions waveforms;
  GeneratorOptions generator;
};
int disassemble(const DisassembleOptions& options);

struct FitOptions {
  std::string script;
  bool isJson = false;
  bool isStrict = false;              // warnings count as errors
  bool isMapped = false;              // shows the map of sample memory
  std::vector<std::string> triggers;  // as those of play
  std::vector<std::string> cleared;   // waveforms that the host clears
  std::string streaming;              // the streaming waveform; empty: none
  std::string output;                 // path of the map's picture; may be empty
  WaveformOptions waveforms;
  GeneratorOptions generator;
};
int fit(const FitOptions& options);

struct DiffOptions {
  std::string first;
  std::string second;
  std::string name;  // of the one script to compare; empty: all
  bool isJson = false;
  WaveformOptions waveforms;
  GeneratorOptions generator;
};
// Returns 0 where both play the same, 1 where not, and 2 for errors in what it was given.
int diff(const DiffOptions& options);

struct ErrorsOptions {
  std::vector<std::string> wanted;  // codes, names or words to search for; empty: all
};
int errors(const ErrorsOptions& options);

struct PlayOptions {
  std::string script;
  std::string name;                   // of the script to play; may be empty where the text holds one
  std::vector<std::string> outputs;   // paths
  std::string outputFormat;           // of outputs whose path has no ending that names one
  bool isJson = false;                // the summary
  std::vector<std::string> triggers;  // "trigger3@20ms" or "trigger3@5000"
  std::string limit = "10M";          // samples or a time
  std::string title;                  // of pictures; empty: made from the script's name
  bool isStrict = false;              // warnings count as errors
  WaveformOptions waveforms;
  GeneratorOptions generator;
};
int play(const PlayOptions& options);

}  // namespace tools::cli
