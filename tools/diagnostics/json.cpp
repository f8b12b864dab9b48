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

nlohmann::ordered_json relatedPlaces(const Diagnostic& diagnostic) {
  auto array = nlohmann::ordered_json::array();
  for (const auto& [place, message] : diagnostic.related) {
    array.push_back({{"line", place.line}, {"column", place.position}, {"message", toPrintable(message)}});
  }
  return array;
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

std::string formatDiagnosticsAsJson(std::span<const Diagnostic> diagnostics, std::span<const std::string> files) {
  auto array = nlohmann::ordered_json::array();
  for (std::size_t i = 0; i < diagnostics.size(); ++i) {
    const Diagnostic& diagnostic = diagnostics[i];
    array.push_back({{"file", toPrintable(files[i])},
                     {"line", diagnostic.place.line},
                     {"column", diagnostic.place.position},
                     {"severity", severityText(diagnostic.severity)},
                     {"message", toPrintable(diagnostic.message)},
                     {"help", toPrintable(diagnostic.help)},
                     {"related", relatedPlaces(diagnostic)},
                     {"constant", diagnostic.constant},
                     {"code", diagnostic.code}});
  }
  return array.dump(2) + "\n";
}

}  // namespace tools
