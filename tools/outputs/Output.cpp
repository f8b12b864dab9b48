#include "tools/outputs/Output.h"

#include <filesystem>
#include <functional>

#include "tools/outputs/formats.h"
#include "tools/text/Refusal.h"

namespace tools {
namespace {

struct Format {
  std::string_view ending;
  void (*check)(const std::string& path, unsigned sampleWidthBits, double sampleRateHz);  // may be null
  void (*write)(AtomicFile& file, const Recording& recording);
};

template <SoundFormat format>
void checkSoundAs(const std::string& path, unsigned sampleWidthBits, double sampleRateHz) {
  checkSound(path, format, sampleWidthBits, sampleRateHz);
}
template <SoundFormat format>
void writeSoundAs(AtomicFile& file, const Recording& recording) {
  writeSound(file, format, recording);
}
template <PictureFormat format>
void writePictureAs(AtomicFile& file, const Recording& recording) {
  writePicture(file, format, recording);
}

constexpr Format kFormats[] = {
    {".wav", checkSoundAs<SoundFormat::kWav>, writeSoundAs<SoundFormat::kWav>},
    {".flac", checkSoundAs<SoundFormat::kFlac>, writeSoundAs<SoundFormat::kFlac>},
    {".csv", nullptr, writeCsv},
    {".npy", nullptr, writeNpy},
    {".vcd", nullptr, writeVcd},
    {".svg", nullptr, writePictureAs<PictureFormat::kSvg>},
    {".png", nullptr, writePictureAs<PictureFormat::kPng>},
    {".pdf", nullptr, writePictureAs<PictureFormat::kPdf>},
};

const Format& findFormat(const std::string& path) {
  std::string known;
  for (const Format& format : kFormats) {
    if (path.ends_with(format.ending)) return format;
    known += (known.empty() ? "" : " ") + std::string(format.ending);
  }
  throw Refusal(path + ": the ending names no known kind of output", "Known endings: " + known + ".");
}

}  // namespace

void checkOutput(const std::string& path, unsigned sampleWidthBits, double sampleRateHz) {
  const Format& format = findFormat(path);
  const std::filesystem::path folder = std::filesystem::path(path).parent_path();
  std::error_code ignored;
  if (!folder.empty() && !std::filesystem::is_directory(folder, ignored)) {
    throw Refusal(path + ": there is no folder " + folder.string());
  }
  if (std::filesystem::is_directory(path, ignored)) throw Refusal(path + ": is a directory");
  if (format.check != nullptr) format.check(path, sampleWidthBits, sampleRateHz);
}

void writeOutput(const std::string& path, const Recording& recording) {
  const Format& format = findFormat(path);
  AtomicFile file(path);
  format.write(file, recording);
  file.commit();
}

}  // namespace tools
