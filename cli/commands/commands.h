// The tool's commands. Each prints its results and returns the exit code: 0, or 1 for errors in what it was given.
// Each throws Refusal for what it cannot work with at all.
#pragma once

#include <optional>
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

// What comes from outside, and which part of the play is asked for; samples or times, empty where nothing was said.
struct WindowOptions {
  std::vector<std::string> triggers;  // "trigger3@20ms" or "trigger3@5000"
  std::string limit;                  // where the play stops; empty: as ComputedPlay::Unlimited says
  std::string from;
  std::string length;
};

struct OutputOptions {
  std::vector<std::string> paths;
  std::string format;  // of those whose path has no ending that names one
};

struct PlayOptions {
  std::string script;
  std::string name;  // of the script to play; may be empty where the text holds one
  OutputOptions outputs;
  bool isJson = false;  // the summary
  WindowOptions window;
  bool isComputed = false;  // though it could be simulated
  std::string title;        // of pictures; empty: made from the script's name
  bool isStrict = false;    // warnings count as errors
  WaveformOptions waveforms;
  GeneratorOptions generator;
};
int play(const PlayOptions& options);

struct PlotOptions {
  std::string script;
  std::vector<std::string> names;  // of the scripts to show; empty: all
  OutputOptions outputs;
  WindowOptions window;
  double width = 1200;             // points
  std::optional<double> height;    // points; nothing: what the lanes take
  std::vector<std::string> lanes;  // "samples", "playing", "markers", "triggers"; empty: all
  bool isDark = false;
  std::string title;      // empty: made from the names
  bool isStrict = false;  // warnings count as errors
  WaveformOptions waveforms;
  GeneratorOptions generator;
};
int plot(const PlotOptions& options);

}  // namespace tools::cli
