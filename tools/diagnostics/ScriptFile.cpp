#include "tools/diagnostics/ScriptFile.h"

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <iterator>

#include "platform/system/paths.h"
#include "tools/text/Refusal.h"

namespace tools {
namespace {

constexpr std::string_view kStandardInput = "-";

}  // namespace

ScriptFile::ScriptFile(std::string name, std::string text)
    : name_(std::move(name)), text_(std::move(text)), hasByteOrderMark_(text_.starts_with(kByteOrderMark)) {
  if (hasByteOrderMark_) text_.erase(0, kByteOrderMark.size());
  lineStarts_.push_back(0);
  for (std::size_t i = text_.find('\n'); i != std::string::npos; i = text_.find('\n', i + 1)) {
    lineStarts_.push_back(i + 1);
  }
}

ScriptFile ScriptFile::read(const std::string& path) {
  if (path == kStandardInput) return {"<standard input>", std::string(std::istreambuf_iterator<char>(std::cin), {})};
  std::error_code ignored;
  if (std::filesystem::is_directory(platform::toPath(path), ignored)) throw Refusal(path + ": is a directory");
  if (!std::filesystem::exists(platform::toPath(path), ignored)) throw Refusal(path + ": no such file");
  std::ifstream stream(platform::toPath(path), std::ios::binary);
  std::string text(std::istreambuf_iterator<char>(stream), {});
  if (!stream) throw Refusal(path + ": cannot be read");
  return {path, std::move(text)};
}

std::string_view ScriptFile::line(std::uint32_t number) const {
  if (number == 0 || number > lineStarts_.size()) return {};
  std::string_view rest = std::string_view(text_).substr(lineStarts_[number - 1]);
  rest = rest.substr(0, rest.find('\n'));
  if (rest.ends_with('\r')) rest.remove_suffix(1);
  return rest;
}

Place ScriptFile::placeOf(std::size_t offset) const {
  const auto after = std::upper_bound(lineStarts_.begin(), lineStarts_.end(), offset);
  return {static_cast<std::uint32_t>(after - lineStarts_.begin()),
          static_cast<std::uint32_t>(offset - *std::prev(after) + 1)};
}

std::string_view ScriptFile::wordAt(Place place) const {
  const std::string_view rest = std::string_view(text_).substr(offsetOf(place));
  return rest.substr(0, rest.find_first_of(" \t\r\n(),/"));
}

std::size_t ScriptFile::offsetOf(Place place) const {
  if (!place.isKnown()) return 0;
  if (place.line > lineStarts_.size()) return text_.size();
  return std::min(text_.size(), lineStarts_[place.line - 1] + place.position - 1);
}

}  // namespace tools
