// Writes a recording into files, all of them while it comes:
//   wav flac      the samples as sound; wav beyond 4 GiB in its 64-bit form
//   csv           a line per sample: number, time, value, used markers and triggers, instruction address, script line
//   npy           the samples as an array
//   vcd           samples, markers, triggers, instruction address and script line for waveform viewers
//   svg png pdf   a picture
// The ending of the file's name says which, in any letter case. Where files go is told in OutputFile.h. What they need
// of memory does not grow with the recording. One thread.
#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "tools/recording/Recording.h"

namespace tools {

struct OutputPlace {
  std::string path;            // "-" for the standard output
  std::string fallbackFormat;  // "csv"; where the path has no ending that names one; may be empty
};

// "wav", "flac" and so on.
std::span<const std::string_view> outputFormats();
std::span<const std::string_view> pictureFormats();  // those among them that are pictures

// Throws Refusal when no format is named, when nothing can be written there, or when the format cannot hold samples of
// that width and rate; to be called before anything is played.
void checkOutput(const OutputPlace& output, unsigned sampleWidthBits, double sampleRateHz);

enum class PictureFormat { kSvg, kPng, kPdf };

// Throws Refusal when the format is none of a picture, naming those that are, or nothing can be written there.
PictureFormat checkPicture(const OutputPlace& output);

// What a file will take, known before its first byte.
struct OutputSize {
  std::string path;
  std::uint64_t leastBytes = 0;
  std::uint64_t greatestBytes = 0;         // UINT64_MAX where nobody can say
  std::optional<std::uint64_t> freeBytes;  // on its disk; nothing for streams
};

// Every function throws Refusal when a file cannot be written; those that are not finished then leave nothing behind.
// An output that nobody reads any more is dropped in silence.
class Outputs {
 public:
  explicit Outputs(const std::vector<OutputPlace>& places);  // that have been checked
  ~Outputs();

  // What the outputs look at; before open() of all, then of those that are still read.
  RecordingParts wanted() const;

  // Throws Refusal when a disk has certainly less room than files on it take that hold such a recording. `header` may
  // be of the beginning of what will be written.
  void requireRoom(const RecordingHeader& header) const;
  std::vector<OutputSize> sizes(const RecordingHeader& header) const;

  // Begins all files; the header must outlive them.
  void open(const RecordingHeader& header);
  void take(const RecordingBlock& block);
  // Gives the files their names.
  void finish();

 private:
  struct Entry;

  std::vector<Entry> entries_;
};

}  // namespace tools
