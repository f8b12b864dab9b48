// What stands for sound files and for the resampler in a build without libsndfile and libsamplerate.
#include "tools/sources/Resampler.h"
#include "tools/sources/SoundFile.h"
#include "tools/text/Refusal.h"

namespace tools {

LoadedWaveform loadSoundFile(const std::string&, Parameters& parameters, const SourceFormat&) {
  parameters.refuse("this build reads no sound files: it was made without libsndfile",
                    "Sources are .csv or .txt columns, .npy arrays, .raw or .bin samples, and shapes such as "
                    "sine:length=1000.");
}

bool isSoundFile(const std::string&) { return false; }

Resampler::Resampler(double ratio, Sink sink) : state_(nullptr, nullptr), ratio_(ratio), sink_(std::move(sink)) {
  throw Refusal("this build does not resample: it was made without libsamplerate", "Leave \"resample\" out.");
}

void Resampler::add(double) {}

void Resampler::finish() {}

void Resampler::convert(bool) {}

// What could be resampled is refused by the constructor, what could not as in other builds.
bool canResample(double ratio) { return ratio >= 1.0 / 256 && ratio <= 256; }

}  // namespace tools
