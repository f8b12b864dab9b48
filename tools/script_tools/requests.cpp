#include "tools/script_tools/requests.h"

#include <nlohmann/json.hpp>
#include <set>

#include "ktcheckname/compareNames.h"
#include "tools/text/Refusal.h"
#include "tools/timeline/raisedTriggers.h"

namespace tools {
namespace {

using nlohmann::json;

json parse(std::string_view text, const char* what) {
  json parsed = json::parse(text.begin(), text.end(), nullptr, false);
  if (parsed.is_discarded()) throw RequestError(std::string(what) + " is no JSON");
  return parsed;
}

// Reads the fields of one object, and refuses those that nobody asked for.
class Fields {
 public:
  Fields(const json& object, std::string what) : object_(object), what_(std::move(what)) {
    if (!object.is_object()) throw RequestError(what_ + " is no JSON object");
  }

  template <typename Integer>
  void integer(const char* name, Integer& value) {
    const json* const field = find(name);
    if (field == nullptr) return;
    if (!field->is_number_unsigned() || field->get<std::uint64_t>() > std::numeric_limits<Integer>::max()) {
      refuse(name, "is no whole number of that size");
    }
    value = static_cast<Integer>(field->get<std::uint64_t>());
  }
  void number(const char* name, double& value) {
    const json* const field = find(name);
    if (field == nullptr) return;
    if (!field->is_number()) refuse(name, "is no number");
    value = field->get<double>();
  }
  void text(const char* name, std::string& value) {
    const json* const field = find(name);
    if (field == nullptr || !field->is_string()) refuse(name, "is no text");
    value = field->get<std::string>();
  }
  void optionalText(const char* name, std::string& value) {
    const json* const field = find(name);
    if (field == nullptr) return;
    if (!field->is_string()) refuse(name, "is no text");
    value = field->get<std::string>();
  }
  void texts(const char* name, std::vector<std::string>& values) {
    const json* const field = find(name);
    if (field == nullptr) return;
    if (!field->is_array()) refuse(name, "is no array");
    for (const json& entry : *field) {
      if (!entry.is_string()) refuse(name, "holds what is no text");
      values.push_back(entry.get<std::string>());
    }
  }
  void checkAllKnown() const {
    for (const auto& [name, value] : object_.items()) {
      if (std::find(known_.begin(), known_.end(), name) == known_.end()) refuse(name, "is unknown");
    }
  }

 private:
  const json* find(const char* name) {
    known_.emplace_back(name);
    const auto found = object_.find(name);
    return found == object_.end() ? nullptr : &*found;
  }
  [[noreturn]] void refuse(const std::string& name, const char* reason) const {
    throw RequestError(what_ + ": \"" + name + "\" " + reason);
  }

  const json& object_;
  std::string what_;
  std::vector<std::string> known_;
};

}  // namespace

GeneratorOptions readGenerator(std::string_view text) {
  GeneratorOptions options;
  if (text.empty()) return options;
  const json parsed = parse(text, "the generator");
  Fields fields(parsed, "the generator");
  fields.integer("sampleWidthBits", options.sampleWidthBits);
  fields.number("sampleRateHz", options.sampleRateHz);
  fields.integer("memorySizeBytes", options.memorySizeBytes);
  fields.integer("memoryWordBytes", options.memoryWordBytes);
  fields.integer("minFetchSamples", options.minFetchSamples);
  fields.integer("sequenceWords", options.sequenceWords);
  fields.integer("maxPrimingWords", options.maxPrimingWords);
  fields.integer("primingDepthSamples", options.primingDepthSamples);
  fields.checkAllKnown();
  try {
    checkWorkable(options);
  } catch (const Refusal& refusal) {
    throw RequestError(std::string("the generator: ") + refusal.what());
  }
  return options;
}

std::vector<WaveformLength> readWaveforms(std::string_view text) {
  std::vector<WaveformLength> waveforms;
  if (text.empty()) return waveforms;
  const json parsed = parse(text, "the list of waveforms");
  if (!parsed.is_array()) throw RequestError("the list of waveforms is no JSON array");
  std::set<std::string, ktcheckname::NameLess> names;
  for (const json& entry : parsed) {
    Fields fields(entry, "waveform " + std::to_string(waveforms.size()));
    WaveformLength& waveform = waveforms.emplace_back();
    fields.text("name", waveform.name);
    fields.integer("samples", waveform.samples);
    fields.checkAllKnown();
    if (!names.insert(waveform.name).second) throw RequestError("waveform \"" + waveform.name + "\" is given twice");
  }
  return waveforms;
}

FitRequest readFitRequest(std::string_view text, double sampleRateHz) {
  FitRequest request;
  if (text.empty()) return request;
  const json parsed = parse(text, "the request");
  Fields fields(parsed, "the request");
  std::vector<std::string> triggers;
  fields.texts("triggers", triggers);
  fields.texts("cleared", request.cleared);
  fields.optionalText("streaming", request.streaming);
  fields.checkAllKnown();
  try {
    request.triggers = readTriggers(triggers, sampleRateHz);
  } catch (const Refusal& refusal) {
    throw RequestError(std::string("the request: ") + refusal.what());
  }
  return request;
}

Fit measureRequestedFit(ProgramBuilder& builder, const std::vector<WaveformLength>& waveforms,
                        const GeneratorOptions& generator, const FitRequest& request) {
  try {
    return measureFit(builder, waveforms, generator, request);
  } catch (const Refusal& refusal) {
    throw RequestError(std::string("the request: ") + refusal.what());
  }
}

}  // namespace tools
