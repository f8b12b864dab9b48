// Where the samples of a waveform come from: NAME=SOURCE on the command line. A source is one of
//   sine:length=1000,cycles=10    a built-in shape with its parameters (see shapeHelp())
//   file.csv, file.csv:COLUMN     a column of a text file (see CsvFile.h)
//   file.npy, file.npz:NAME       an array (see NpyFile.h)
//   file.raw, file.bin            little-endian samples of the generator's width
//   file.wav, file.wav:2          any other file: a sound file, and which channel, from 1 (default: the first)
// with parameters behind the colon (see Parameters.h): file.csv:volts,full-scale=5V
//
// Full scale: a fraction x becomes x * 2^(width - 1), rounded to the nearest, so that sound files of the generator's
// width play bit for bit; +1 exactly becomes the greatest code. Values beyond -1..1 are clipped and counted. Sources
// give the same samples on every run and machine.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "tools/recording/SampleBuffer.h"

namespace tools {

// The generator that the samples are for.
struct SourceFormat {
  unsigned sampleWidthBits = 16;  // 16 or 32
  double sampleRateHz = 1e6;      // what turns times and frequencies into samples
  std::uint64_t maxSamples = 0;   // sample memory; a longer source is refused without being read to its end
};

struct LoadedWaveform {
  SampleBuffer samples;
  std::uint64_t clippedSamples = 0;
  double recordedRateHz = 0;         // 0: the source names none
  std::vector<std::string> notes{};  // what was taken, where that could have been meant otherwise
};

// Throws Refusal: no such file, a directory, unreadable, damaged or of no known kind, no such channel, column or array
// or none chosen, a bad parameter, no samples, too many, or a sample that is no finite number (its place is named).
LoadedWaveform loadSource(const std::string& source, const SourceFormat& format);

// The waveforms of one command.
struct WaveformOptions {
  std::vector<std::string> given;    // NAME=SOURCE
  std::vector<std::string> folders;  // whose sound files are waveforms too
};

struct NamedSource {
  std::string name;
  std::string source;
};

// "NAME=SOURCE" cut in two. Throws Refusal.
NamedSource parseNamedSource(const std::string& argument);

// Every file directly in `folder`, in the order of the names; a name is the file's stem without the characters that
// script names cannot hold ("camera-shutter.oga" is "camerashutter"). Opens none of them: whether a file is a sound is
// for isSoundSource(). Throws Refusal when the folder cannot be read.
std::vector<NamedSource> listFolder(const std::string& folder);

// Whether it is a sound file.
bool isSoundSource(const std::string& path);

// The built-in shapes and their parameters, for --help.
std::string shapeHelp();

}  // namespace tools
