// Writes a recording into a file:
//   wav flac      the samples as sound
//   csv           a line per sample: number, time, value, used markers and triggers, instruction address, script line
//   npy           the samples as an array
//   vcd           samples, markers, triggers, instruction address and script line for waveform viewers
//   svg png pdf   a picture
// The ending of the file's name says which, in any letter case. Where files go is told in OutputFile.h.
#pragma once

#include <functional>
#include <span>
#include <string>
#include <string_view>

#include "tools/recording/Recording.h"

namespace tools {

struct OutputPlace {
  std::string path;            // "-" for the standard output
  std::string fallbackFormat;  // "csv"; where the path has no ending that names one; may be empty
};

// How far the writing is, from 0 to 1.
using Progress = std::function<void(double fraction)>;

// "wav", "flac" and so on.
std::span<const std::string_view> outputFormats();

// Throws Refusal when no format is named, when nothing can be written there, or when the format cannot hold samples of
// that width and rate; to be called before anything is played.
void checkOutput(const OutputPlace& output, unsigned sampleWidthBits, double sampleRateHz);

// Throws Refusal when the file cannot be written.
void writeOutput(const OutputPlace& output, const Recording& recording, const Progress& progress);

}  // namespace tools
