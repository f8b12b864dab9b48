#include "tools/script_tools/documents.h"

#include <algorithm>
#include <nlohmann/json.hpp>

#include "kterr/ErrorConstant.h"
#include "tools/diagnostics/elaboration.h"
#include "tools/diagnostics/json.h"
#include "tools/program/listing.h"
#include "tools/text/characters.h"

namespace tools {
namespace {

using nlohmann::ordered_json;

std::string write(const ordered_json& fields) {
  ordered_json document = {{"schema", 1}};
  document.update(fields);
  return document.dump(-1, ' ', false, ordered_json::error_handler_t::replace);
}

ordered_json makeInstruction(const Program& program, std::size_t address, const ProgramBuilder& builder) {
  const ListedInstruction listed = listInstruction(program, address, builder);
  return {{"meaning", listed.meaning},
          {"samples", listed.samples},
          {"memoryWords", listed.memoryWords},
          {"line", program.places[address].line},
          {"column", program.places[address].position}};
}

ordered_json makeScript(const Program& program, const ProgramBuilder& builder) {
  const std::uint64_t capacity = builder.traits().sequenceMemoryWords;
  const std::uint64_t instructions = program.entry.instructionWords.size();
  const auto samples = countPlayedSamples(program, builder);
  return {{"name", program.entry.script.name},
          {"instructions", instructions},
          {"capacity", capacity},
          {"fits", instructions <= capacity},
          {"samples", samples ? ordered_json(*samples) : ordered_json(nullptr)}};
}

ordered_json makeWaveform(const WaveformFit& waveform) {
  ordered_json entry = {{"name", waveform.name}, {"samples", waveform.samples}, {"fits", waveform.reason.empty()}};
  if (!waveform.reason.empty()) entry["reason"] = waveform.reason;
  return entry;
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

std::string makeFitDocument(const ScriptFile& file, const ProgramBuilder& builder,
                            const std::vector<WaveformFit>& waveforms, const std::vector<Program>& programs,
                            const std::vector<Diagnostic>& diagnostics) {
  const auto places = [](const WaveformFit& waveform) { return waveform.reason.empty(); };
  const auto scripts = makeArray(programs, [&](const Program& program) { return makeScript(program, builder); });
  const bool fits =
      diagnostics.empty() && std::all_of(waveforms.begin(), waveforms.end(), places) &&
      std::all_of(scripts.begin(), scripts.end(), [](const auto& script) { return script["fits"] == true; });
  const ordered_json memory = {{"usedBytes", builder.usedBytes()},
                               {"sizeBytes", builder.traits().memorySizeBytes},
                               {"largestFreeBytes", builder.largestFreeBytes()}};
  return write({{"fits", fits},
                {"sampleMemory", memory},
                {"waveforms", makeArray(waveforms, makeWaveform)},
                {"scripts", scripts},
                {"diagnostics", diagnosticsAsJson(file, diagnostics)}});
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
