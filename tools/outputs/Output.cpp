#include "tools/outputs/Output.h"

#include <algorithm>
#include <array>
#include <filesystem>

#include "tools/outputs/formats.h"
#include "tools/text/Refusal.h"
#include "tools/text/characters.h"
#include "tools/text/words.h"

namespace tools {
namespace {

struct Format {
  std::string_view name;
  void (*check)(const std::string& path, unsigned sampleWidthBits, double sampleRateHz);  // may be null
  void (*write)(OutputFile& file, const Recording& recording, const Progress& progress);
  bool needsSeeking = false;
};

template <SoundFormat format>
void checkSoundAs(const std::string& path, unsigned sampleWidthBits, double sampleRateHz) {
  checkSound(path, format, sampleWidthBits, sampleRateHz);
}
template <SoundFormat format>
void writeSoundAs(OutputFile& file, const Recording& recording, const Progress& progress) {
  writeSound(file, format, recording, progress);
}
template <PictureFormat format>
void writePictureAs(OutputFile& file, const Recording& recording, const Progress& progress) {
  writePicture(file, format, recording, progress);
}

constexpr Format kFormats[] = {
    {"wav", checkSoundAs<SoundFormat::kWav>, writeSoundAs<SoundFormat::kWav>, true},
    {"flac", checkSoundAs<SoundFormat::kFlac>, writeSoundAs<SoundFormat::kFlac>, true},
    {"csv", nullptr, writeCsv},
    {"npy", nullptr, writeNpy},
    {"vcd", nullptr, writeVcd},
    {"svg", nullptr, writePictureAs<PictureFormat::kSvg>},
    {"png", nullptr, writePictureAs<PictureFormat::kPng>},
    {"pdf", nullptr, writePictureAs<PictureFormat::kPdf>},
};

constexpr auto kFormatNames = [] {
  std::array<std::string_view, std::size(kFormats)> names;
  std::ranges::transform(kFormats, names.begin(), &Format::name);
  return names;
}();

const Format* findByName(std::string_view name) {
  const Format* const found = std::ranges::find(kFormats, name, &Format::name);
  return found == std::end(kFormats) ? nullptr : found;
}

const Format* findByEnding(const std::string& path) {
  std::string ending = std::filesystem::path(path).extension().string();
  std::ranges::transform(ending, ending.begin(), toLower);
  return ending.empty() ? nullptr : findByName(std::string_view(ending).substr(1));
}

const Format& findFormat(const OutputPlace& output) {
  if (const Format* format = findByEnding(output.path)) return *format;
  if (const Format* format = findByName(output.fallbackFormat)) return *format;
  const bool isStream = output.path == kStandardOutput;
  throw Refusal(isStream ? "the standard output has no ending that names a format"
                         : output.path + ": the ending names no known kind of output",
                (isStream ? "Known formats: " : "Known endings: .") + join(kFormatNames, isStream ? " " : " .") + ".",
                Setting::kOutputFormat);
}

}  // namespace

std::span<const std::string_view> outputFormats() { return kFormatNames; }

void checkOutput(const OutputPlace& output, unsigned sampleWidthBits, double sampleRateHz) {
  const Format& format = findFormat(output);
  checkPlace(output.path);
  if (format.check != nullptr) format.check(output.path, sampleWidthBits, sampleRateHz);
}

void writeOutput(const OutputPlace& output, const Recording& recording, const Progress& progress) try {
  const Format& format = findFormat(output);
  OutputFile file(output.path, format.needsSeeking);
  format.write(file, recording, progress);
  file.commit();
} catch (const ReaderGone&) {
  return;
}

}  // namespace tools
