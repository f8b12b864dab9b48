// The writers behind writeOutput(), one per kind of file. Each writes the whole of `file` and leaves the commit to
// its caller; each throws UserError when the file cannot be written.
#pragma once

#include "cli/Recording.h"
#include "cli/outputs/AtomicFile.h"

namespace cli {

enum class SoundFormat { kWav, kFlac };

// Throws UserError when the format cannot hold such samples.
void checkSound(const std::string& path, SoundFormat format, unsigned sampleWidthBits, double sampleRateHz);
void writeSound(AtomicFile& file, SoundFormat format, const Recording& recording);

void writeCsv(AtomicFile& file, const Recording& recording);
void writeNpy(AtomicFile& file, const Recording& recording);
void writeVcd(AtomicFile& file, const Recording& recording);

enum class PictureFormat { kSvg, kPng, kPdf };
void writePicture(AtomicFile& file, PictureFormat format, const Recording& recording);

}  // namespace cli
