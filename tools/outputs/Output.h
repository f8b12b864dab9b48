// Writes a recording into a file whose ending says how:
//   .wav .flac      the samples as sound
//   .csv            a line per sample: number, time, value, used markers and triggers, instruction address, script line
//   .npy            the samples as an array
//   .vcd            samples, markers, triggers, instruction address and script line for waveform viewers
//   .svg .png .pdf  a picture
// A file appears under its name only when it is whole.
#pragma once

#include <string>

#include "tools/recording/Recording.h"

namespace tools {

// Throws Refusal when `path` has no such ending, when its folder does not exist, or when the format cannot hold
// samples of that width and rate; to be called before anything is played.
void checkOutput(const std::string& path, unsigned sampleWidthBits, double sampleRateHz);

// Throws Refusal when the file cannot be written.
void writeOutput(const std::string& path, const Recording& recording);

}  // namespace tools
