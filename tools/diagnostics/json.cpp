#include "tools/diagnostics/json.h"

#include <algorithm>
#include <nlohmann/json.hpp>

#include "tools/text/characters.h"

namespace tools {
namespace {

using nlohmann::json;

// Members of an elaboration that are no message.
constexpr std::string_view kFixedMembers[] = {"error_constant", "file",       "line",
                                              "component",      "translator", "translator_info"};

std::string textOf(const json& value) { return value.is_string() ? value.get<std::string>() : value.dump(); }

std::optional<std::int64_t> numberOf(const json& value) {
  return value.is_number_integer() ? std::optional(value.get<std::int64_t>()) : std::nullopt;
}

std::vector<ElaborationRecord::Value> readValues(const json& elaboration) {
  std::vector<ElaborationRecord::Value> values;
  const json none = json::array();
  const auto info = elaboration.value("translator_info", json::object());
  for (const json& entry : info.is_object() ? info.value("ordered_data", none) : none) {
    const bool isUsage = entry.is_object() && entry.contains("value") && entry.value("usage", json()).is_string();
    if (isUsage) values.push_back({entry["usage"], textOf(entry["value"]), numberOf(entry["value"])});
  }
  return values;
}

using nlohmann::ordered_json;

// Code units of UTF-16; a byte that is no UTF-8 counts as the one that stands for it.
std::size_t utf16Length(std::string_view text) {
  std::size_t length = 0;
  for (const char32_t character : toCharacters(text)) length += character > 0xFFFF ? 2 : 1;
  return length;
}

ordered_json makePlace(const ScriptFile& file, std::size_t offset) {
  const Place place = file.placeOf(offset);
  const std::string_view before =
      std::string_view(file.text()).substr(offset - (place.position - 1), place.position - 1);
  return {{"offset", offset}, {"line", place.line}, {"column", place.position}, {"utf16", utf16Length(before)}};
}

ordered_json makeRange(const ScriptFile& file, std::size_t offset, std::size_t length) {
  return {{"start", makePlace(file, offset)}, {"end", makePlace(file, std::min(offset + length, file.text().size()))}};
}

ordered_json rangeOf(const ScriptFile* file, Place place, std::size_t length) {
  if (file == nullptr || !place.isKnown()) return nullptr;
  return makeRange(*file, file->offsetOf(place), length);
}

ordered_json makeRelated(const ScriptFile* file, const Diagnostic& diagnostic) {
  auto array = ordered_json::array();
  for (const auto& [place, message] : diagnostic.related) {
    const std::size_t length = file == nullptr ? 0 : file->wordAt(place).size();
    array.push_back({{"range", rangeOf(file, place, length)}, {"message", toPrintable(message)}});
  }
  return array;
}

ordered_json makeFixes(const ScriptFile* file, const Diagnostic& diagnostic) {
  auto array = ordered_json::array();
  for (const Diagnostic::Fix& fix : diagnostic.fixes) {
    array.push_back({{"range", makeRange(*file, fix.offset, fix.length)},
                     {"text", fix.text},
                     {"confidence", fix.isCertain ? "certain" : "maybe"}});
  }
  return array;
}

ordered_json makeDiagnostic(const std::string& name, const ScriptFile* file, const Diagnostic& diagnostic) {
  const std::size_t word = file == nullptr ? 0 : file->wordAt(diagnostic.place).size();
  return {{"file", toPrintable(name)},
          {"range", rangeOf(file, diagnostic.place, diagnostic.length == 0 ? word : diagnostic.length)},
          {"severity", severityText(diagnostic.severity)},
          {"message", toPrintable(diagnostic.message)},
          {"help", toPrintable(diagnostic.help)},
          {"related", makeRelated(file, diagnostic)},
          {"fixes", makeFixes(file, diagnostic)},
          {"constant", diagnostic.constant},
          {"code", diagnostic.code}};
}

}  // namespace

ElaborationRecord readElaboration(const char* text) {
  const json elaboration = json::parse(text == nullptr ? std::string() : toValidUtf8(text), nullptr, false);
  if (!elaboration.is_object()) return {};
  ElaborationRecord record;
  const json constant = elaboration.value("error_constant", json());
  if (constant.is_string()) record.constant = constant;
  for (const auto& [key, value] : elaboration.items()) {
    const bool isMessage = std::ranges::find(kFixedMembers, key) == std::end(kFixedMembers) && value.is_string();
    if (isMessage) record.messages.push_back(value);
  }
  record.values = readValues(elaboration);
  return record;
}

ordered_json diagnosticsAsJson(const ScriptFile& file, std::span<const Diagnostic> diagnostics) {
  auto array = ordered_json::array();
  for (const Diagnostic& diagnostic : diagnostics) {
    array.push_back(makeDiagnostic("", &file, diagnostic));
    array.back().erase("file");
  }
  return array;
}

std::string formatDiagnosticsAsJson(std::span<const FileDiagnostics> files) {
  auto array = ordered_json::array();
  for (const auto& [name, file, diagnostics] : files) {
    for (const Diagnostic& diagnostic : diagnostics) array.push_back(makeDiagnostic(name, file.get(), diagnostic));
  }
  return ordered_json{{"schema", 1}, {"diagnostics", std::move(array)}}.dump(2) + "\n";
}

std::string quoteAsJson(std::string_view text) { return json(toPrintable(text)).dump(); }

}  // namespace tools
