#include "tools/sources/Source.h"

#include <algorithm>
#include <filesystem>
#include <fstream>

#include "platform/system/paths.h"
#include "tools/sources/CsvFile.h"
#include "tools/sources/NpyFile.h"
#include "tools/sources/Parameters.h"
#include "tools/sources/RawFile.h"
#include "tools/sources/Shape.h"
#include "tools/sources/SoundFile.h"
#include "tools/text/Refusal.h"
#include "tools/text/characters.h"
#include "tools/text/nearMiss.h"

namespace tools {
namespace {

struct FileAndParameters {
  std::string path;
  std::string parameters;  // what stands behind the colon
};

bool isThere(const std::string& path) {
  std::error_code ignored;
  return std::filesystem::exists(platform::toPath(path), ignored);
}

// The path is the longest part before a colon that is there, since names of files and of columns may hold colons too.
FileAndParameters splitSource(const std::string& source) {
  if (isThere(source)) return {source, ""};
  const std::size_t drive = platform::toText(platform::toPath(source).root_name()).size();  // "C:", of some systems
  for (std::size_t colon = source.rfind(':'); colon != std::string::npos && colon > 0 && colon >= drive;
       colon = source.rfind(':', colon - 1)) {
    const std::string path = source.substr(0, colon);
    if (isThere(path)) return {path, source.substr(colon + 1)};
  }
  return {source.substr(0, source.find(':', drive)), ""};
}

void checkReadable(const std::string& source, const std::string& path) {
  std::error_code error;
  const auto status = std::filesystem::status(platform::toPath(path), error);
  if (std::filesystem::is_directory(status)) throw Refusal(source + ": is a directory");
  if (!std::filesystem::exists(status)) {
    throw Refusal(source + ": no such file", tellSimilar("shape", path, shapeNames()));
  }
  if (!std::ifstream(platform::toPath(path))) throw Refusal(source + ": cannot be opened for reading");
}

std::string lowerEnding(const std::string& path) {
  std::string ending = platform::toText(platform::toPath(path).extension());
  std::ranges::transform(ending, ending.begin(), toLower);
  return ending;
}

using Load = LoadedWaveform (*)(const std::string& path, Parameters& parameters, const SourceFormat& format);

struct EndingRow {
  std::string_view ending;
  Load load;
};
constexpr EndingRow kEndings[] = {
    {".csv", loadCsvColumn}, {".tsv", loadCsvColumn},  {".txt", loadCsvColumn},  {".npy", loadNpyFile},
    {".npz", loadNpzFile},   {".raw", loadRawSamples}, {".bin", loadRawSamples},
};

Load loaderOf(const std::string& ending) {
  for (const EndingRow& row : kEndings) {
    if (row.ending == ending) return row.load;
  }
  return loadSoundFile;
}

bool canStandInScript(char c) {
  return (c >= '0' && c <= '9') || (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || static_cast<signed char>(c) < 0;
}

std::string scriptName(std::string stem) {
  std::erase_if(stem, [](char c) { return !canStandInScript(c); });
  return stem;
}

}  // namespace

LoadedWaveform loadSource(const std::string& source, const SourceFormat& format) {
  const std::size_t nameEnd = std::min(source.find(':'), source.size());
  const std::string_view name = std::string_view(source).substr(0, nameEnd);
  if (isShapeName(name)) {
    return makeShape(source, name, std::string_view(source).substr(std::min(nameEnd + 1, source.size())), format);
  }
  const auto [path, text] = splitSource(source);
  checkReadable(source, path);
  Parameters parameters = parseFileParameters(source, text);
  return loaderOf(lowerEnding(path))(path, parameters, format);
}

NamedSource parseNamedSource(const std::string& argument) {
  const std::size_t equals = argument.find('=');
  if (equals == std::string::npos || equals == 0 || equals + 1 == argument.size()) {
    throw Refusal("\"" + argument + "\" is not of the form NAME=SOURCE", "For example: pulse=pulse.wav",
                  Setting::kWaveform);
  }
  return {argument.substr(0, equals), argument.substr(equals + 1)};
}

bool isSoundSource(const std::string& path) { return isSoundFile(path); }

std::vector<NamedSource> listFolder(const std::string& folder) {
  std::vector<NamedSource> sources;
  std::error_code error;
  for (std::filesystem::directory_iterator file(platform::toPath(folder), error), end; !error && file != end;
       file.increment(error)) {
    std::error_code ignored;
    if (!file->is_regular_file(ignored)) continue;
    sources.push_back({scriptName(platform::toText(file->path().stem())), platform::toText(file->path())});
  }
  if (error) throw Refusal(folder + ": " + error.message());
  std::sort(sources.begin(), sources.end(), [](const NamedSource& a, const NamedSource& b) {
    return std::tie(a.name, a.source) < std::tie(b.name, b.source);
  });
  return sources;
}

}  // namespace tools
