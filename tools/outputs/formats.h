// The writers behind writeOutput(), one per kind of file. Each writes the whole of `file` and leaves the commit to
// its caller; each throws Refusal when the file cannot be written.
#pragma once

#include "tools/outputs/AtomicFile.h"
#include "tools/recording/Recording.h"

namespace tools {

enum class SoundFormat { kWav, kFlac };

// Throws Refusal when the format cannot hold such samples.
void checkSound(const std::string& path, SoundFormat format, unsigned sampleWidthBits, double sampleRateHz);
void writeSound(AtomicFile& file, SoundFormat format, const Recording& recording);

void writeCsv(AtomicFile& file, const Recording& recording);
void writeNpy(AtomicFile& file, const Recording& recording);
void writeVcd(AtomicFile& file, const Recording& recording);

enum class PictureFormat { kSvg, kPng, kPdf };
void writePicture(AtomicFile& file, PictureFormat format, const Recording& recording);

}  // namespace tools
