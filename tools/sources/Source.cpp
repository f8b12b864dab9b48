#include "tools/sources/Source.h"

#include <algorithm>
#include <filesystem>
#include <fstream>

#include "tools/sources/SampleFile.h"
#include "tools/sources/Shape.h"
#include "tools/sources/SoundFile.h"
#include "tools/text/Refusal.h"
#include "tools/text/characters.h"
#include "tools/text/nearMiss.h"
#include "tools/text/words.h"

namespace tools {
namespace {

struct FileAndSelector {
  std::string path;
  std::string selector;  // what stands behind the last colon; empty when the whole text is the path
};

FileAndSelector splitSelector(const std::string& source) {
  const std::size_t colon = source.rfind(':');
  std::error_code ignored;
  if (colon == std::string::npos || std::filesystem::exists(source, ignored)) return {source, ""};
  return {source.substr(0, colon), source.substr(colon + 1)};
}

void checkReadable(const std::string& source, const std::string& path) {
  std::error_code error;
  const auto status = std::filesystem::status(path, error);
  if (std::filesystem::is_directory(status)) throw Refusal(source + ": is a directory");
  if (!std::filesystem::exists(status)) {
    throw Refusal(source + ": no such file", didYouMean(path.substr(0, path.find(':')), shapeNames(), "the shape "));
  }
  if (!std::ifstream(path)) throw Refusal(source + ": cannot be opened for reading");
}

std::string lowerEnding(const std::string& path) {
  std::string ending = std::filesystem::path(path).extension().string();
  std::ranges::transform(ending, ending.begin(), toLower);
  return ending;
}

int parseChannel(const std::string& source, const std::string& selector) {
  if (selector.empty()) return 1;
  if (const auto channel = parseInteger<int>(selector)) return *channel;
  throw Refusal(source + ": \"" + selector + "\" is not a channel number");
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
  const auto [path, selector] = splitSelector(source);
  checkReadable(source, path);
  const std::string ending = lowerEnding(path);
  if (ending == ".csv" || ending == ".tsv") return loadCsvColumn(source, path, selector, format);
  if (ending == ".raw" || ending == ".bin") return loadRawSamples(source, path, format);
  return loadSoundFile(source, path, parseChannel(source, selector), format);
}

NamedSource parseNamedSource(const std::string& argument) {
  const std::size_t equals = argument.find('=');
  if (equals == std::string::npos || equals == 0 || equals + 1 == argument.size()) {
    throw Refusal("\"" + argument + "\" is not of the form NAME=SOURCE", "For example: pulse=pulse.wav",
                  Setting::kWaveform);
  }
  return {argument.substr(0, equals), argument.substr(equals + 1)};
}

std::vector<NamedSource> listFolder(const std::string& folder) {
  std::vector<NamedSource> sources;
  std::error_code error;
  for (std::filesystem::directory_iterator file(folder, error), end; !error && file != end; file.increment(error)) {
    std::error_code ignored;
    if (!file->is_regular_file(ignored) || !isSoundFile(file->path().string())) continue;
    sources.push_back({scriptName(file->path().stem().string()), file->path().string()});
  }
  if (error) throw Refusal(folder + ": " + error.message());
  std::sort(sources.begin(), sources.end(), [](const NamedSource& a, const NamedSource& b) {
    return std::tie(a.name, a.source) < std::tie(b.name, b.source);
  });
  return sources;
}

}  // namespace tools
