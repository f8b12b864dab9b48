// The writers behind writeOutput(), one per kind of file. Each writes the whole of `file` and leaves the commit to
// its caller; each throws what OutputFile throws. The lengths of sound files stand at their beginning, so that they
// need a file that can seek.
#pragma once

#include "tools/outputs/Output.h"
#include "tools/outputs/OutputFile.h"
#include "tools/recording/Recording.h"

namespace tools {

// After so many samples a writer tells how far it is.
inline constexpr std::size_t kSamplesPerStep = 65536;

enum class SoundFormat { kWav, kFlac };

// Throws Refusal when the format cannot hold such samples.
void checkSound(const std::string& path, SoundFormat format, unsigned sampleWidthBits, double sampleRateHz);
void writeSound(OutputFile& file, SoundFormat format, const Recording& recording, const Progress& progress);

void writeCsv(OutputFile& file, const Recording& recording, const Progress& progress);
void writeNpy(OutputFile& file, const Recording& recording, const Progress& progress);
void writeVcd(OutputFile& file, const Recording& recording, const Progress& progress);

enum class PictureFormat { kSvg, kPng, kPdf };
void writePicture(OutputFile& file, PictureFormat format, const Recording& recording, const Progress& progress);

}  // namespace tools
