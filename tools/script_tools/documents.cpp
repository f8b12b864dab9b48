#include "tools/script_tools/documents.h"

#include <nlohmann/json.hpp>

#include "kterr/ErrorConstant.h"
#include "tools/diagnostics/elaboration.h"
#include "tools/diagnostics/json.h"
#include "tools/program/listing.h"
#include "tools/text/characters.h"

namespace tools {
namespace {

using nlohmann::ordered_json;

std::string dump(const ordered_json& document) {
  return document.dump(-1, ' ', false, ordered_json::error_handler_t::replace);
}

std::string write(const ordered_json& fields) {
  ordered_json document = {{"schema", 1}};
  document.update(fields);
  return dump(document);
}

ordered_json makeInstruction(const Program& program, std::size_t address, const ProgramBuilder& builder) {
  const ListedInstruction listed = listInstruction(program, address, builder);
  return {{"meaning", listed.meaning},
          {"samples", listed.samples},
          {"memoryWords", listed.memoryWords},
          {"line", program.places[address].line},
          {"column", program.places[address].position}};
}

template <typename Range, typename Make>
ordered_json makeArray(const Range& range, Make make) {
  auto array = ordered_json::array();
  for (const auto& item : range) array.push_back(make(item));
  return array;
}

}  // namespace

std::string makeCheckDocument(const ScriptFile& file, const std::vector<Diagnostic>& diagnostics) {
  return write({{"diagnostics", diagnosticsAsJson(file, diagnostics)}});
}

std::string makeListDocument(const Program& program, const ProgramBuilder& builder) {
  auto instructions = ordered_json::array();
  for (std::size_t address = 0; address < program.origins.size(); ++address) {
    instructions.push_back(makeInstruction(program, address, builder));
  }
  return write({{"name", program.entry.script.name}, {"instructions", std::move(instructions)}});
}

std::string makeFitDocument(const ScriptFile& file, const Fit& fit) {
  std::string document;
  JsonWriter json([&document](std::string_view text) { document += text; });
  addFit(fit, json);
  json.addBare("diagnostics", dump(diagnosticsAsJson(file, fit.diagnostics)));
  json.finish();
  return document;
}

std::string makeDifferenceDocument(std::span<const ComparedScripts> scripts) {
  return describeDifferences(scripts).dump(-1, ' ', false, ordered_json::error_handler_t::replace);
}

std::string makeErrorTable() {
  return write({{"errors", makeArray(kterr::allErrorConstants(), [](const kterr::ErrorConstant& constant) {
                   return ordered_json{{"constant", constant.text == nullptr ? "" : constant.text},
                                       {"name", constant.cName},
                                       {"code", constant.code},
                                       {"meaning", constant.meaning},
                                       {"help", helpOf(constant)}};
                 })}});
}

std::string makeErrorDocument(const std::string& message) { return write({{"error", toPrintable(message)}}); }

}  // namespace tools
