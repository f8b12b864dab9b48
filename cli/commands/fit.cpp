#include <algorithm>

#include "cli/JsonWriter.h"
#include "cli/LoadedScript.h"
#include "cli/commands/commands.h"
#include "cli/commands/report.h"
#include "cli/console.h"
#include "conventions/conventions.h"
#include "kterr/Exception.h"
#include "ktorba/settings/SettingsCalculator.h"
#include "tools/diagnostics/elaboration.h"
#include "tools/program/listing.h"
#include "tools/text/Refusal.h"
#include "tools/text/quantities.h"

namespace tools::cli {
namespace {

constexpr std::uint64_t kLongestWaveform = 0xFFFFFFFF;  // samples; what the library can count

struct WaveformFit {
  std::string name;
  std::uint64_t samples;
  std::optional<std::string> refusal;
};

struct ScriptFit {
  const Program* program;
  std::uint32_t primingAsked;  // samples
  std::uint32_t primingWords = 0;
  std::optional<std::string> refusal = {};
  std::optional<std::string> primingRefusal = {};
};

struct Fit {
  std::vector<WaveformFit> waveforms;
  std::vector<ScriptFit> scripts;       // that could be built
  std::vector<Diagnostic> diagnostics;  // of those that could not

  bool fits() const {
    const auto isRefused = [](const auto& part) { return part.refusal.has_value(); };
    const auto isNotPrimed = [](const ScriptFit& script) { return script.primingRefusal.has_value(); };
    return diagnostics.empty() && std::ranges::none_of(waveforms, isRefused) &&
           std::ranges::none_of(scripts, isRefused) && std::ranges::none_of(scripts, isNotPrimed);
  }
};

WaveformFit place(LoadedScript& loaded, const NamedWaveform& named) {
  const std::uint64_t samples = named.waveform.samples.size();
  try {
    loaded.builder.addWaveform(named.name, samples);
    return {named.name, samples, {}};
  } catch (const Refusal& error) {
    loaded.builder.addUnplacedWaveform(named.name, samples);
    return {named.name, samples, error.what()};
  }
}

void prime(const LoadedScript& loaded, ScriptFit& fit) {
  ktorba::GenerationSettings requested;
  requested.primingDepth = fit.primingAsked;
  requested.activeScriptLength = fit.program->entry.finiteMemoryWords;
  ktorba::AdjustedSettings adjusted;
  ktorba::HWSettingsRecord hardware;
  try {
    ktorba::SettingsCalculator(loaded.builder.traits())
        .calculateSettings(loaded.builder.waveforms(), requested, adjusted, hardware);
    fit.primingWords = hardware.settings.primingDepthWords;
  } catch (const kterr::Exception& error) {
    fit.primingRefusal = diagnoseFailure(error.code(), error.getJson()).message;
  }
}

ScriptFit measure(const LoadedScript& loaded, const Program& program, const GeneratorOptions& generator) {
  const std::uint32_t asked = generator.primingDepthSamples;
  const std::uint32_t usual = ktorba::kDefaultPrimingWords * loaded.builder.traits().samplesPerMemoryWord;
  ScriptFit fit = {&program, asked > 0 ? asked : usual};
  const std::uint64_t words = program.entry.instructionWords.size();
  if (words > generator.sequenceWords) {
    fit.refusal = "script " + program.entry.script.name + " has " + formatCount(words - generator.sequenceWords) +
                  " instructions too many";
  }
  prime(loaded, fit);
  return fit;
}

Fit measure(LoadedScript& loaded, const GeneratorOptions& generator) {
  Fit fit;
  for (const NamedWaveform& named : loaded.waveforms) fit.waveforms.push_back(place(loaded, named));
  loaded.programs = loaded.builder.build(fit.diagnostics);
  for (const Program& program : loaded.programs) fit.scripts.push_back(measure(loaded, program, generator));
  return fit;
}

// The rows for people.
class FitReport {
 public:
  FitReport(const Fit& fit, const LoadedScript& loaded, const GeneratorOptions& generator)
      : fit_(fit), loaded_(loaded), generator_(generator) {}

  void print() const {
    printRow("generator", describe(generator_));
    for (const WaveformFit& waveform : fit_.waveforms) printWaveform(waveform);
    printMemory();
    for (const ScriptFit& script : fit_.scripts) printScript(script);
  }

 private:
  void printWaveform(const WaveformFit& waveform) const {
    if (waveform.refusal) return printRow("DOES NOT FIT", *waveform.refusal);
    printRow("waveform", waveform.name + ": " + formatCount(waveform.samples) + " samples, " +
                             formatQuantity(static_cast<double>(waveform.samples) / generator_.sampleRateHz, "s"));
  }

  void printMemory() const {
    const std::uint64_t used = loaded_.builder.usedBytes();
    const std::uint64_t all = generator_.memorySizeBytes;
    const auto tenths = static_cast<std::uint64_t>(1000.0 * static_cast<double>(used) / static_cast<double>(all));
    printRow("sample memory", formatCount(used) + " of " + formatCount(all) + " bytes (" + std::to_string(tenths / 10) +
                                  "." + std::to_string(tenths % 10) + " %), largest block left " +
                                  formatCount(loaded_.builder.largestFreeBytes()) + " bytes");
  }

  void printScript(const ScriptFit& script) const {
    const ktorba::ScriptEntry& entry = script.program->entry;
    printRow("script", entry.script.name + ": " + formatCount(entry.instructionWords.size()) + " of " +
                           formatCount(generator_.sequenceWords) + " instructions, plays " +
                           describeDuration(*script.program, loaded_.builder, generator_.sampleRateHz));
    if (script.refusal) printRow("DOES NOT FIT", *script.refusal);
    if (script.primingRefusal) return printRow("DOES NOT FIT", *script.primingRefusal);
    const std::uint64_t samples = std::uint64_t{script.primingWords} * loaded_.builder.traits().samplesPerMemoryWord;
    printRow("priming", formatCount(script.primingWords) + " memory words, " + formatCount(samples) + " samples, of " +
                            formatCount(script.primingAsked) + " samples asked for");
  }

  const Fit& fit_;
  const LoadedScript& loaded_;
  const GeneratorOptions& generator_;
};

void addWaveforms(JsonWriter& json, const Fit& fit) {
  json.openArray("waveforms");
  for (const WaveformFit& waveform : fit.waveforms) {
    json.openObject();
    json.add("name", waveform.name);
    json.add("samples", waveform.samples);
    json.add("refusal", waveform.refusal);
    json.close();
  }
  json.close();
}

void addScript(JsonWriter& json, const ScriptFit& script, const LoadedScript& loaded, const FitOptions& options) {
  json.openObject();
  json.add("name", script.program->entry.script.name);
  json.addUsage("instructions", script.program->entry.instructionWords.size(), options.generator.sequenceWords);
  json.add("plays", describeDuration(*script.program, loaded.builder, options.generator.sampleRateHz));
  json.add("samples", countPlayedSamples(*script.program, loaded.builder));
  json.add("primingWords", script.primingWords);
  json.add("refusal", script.refusal ? script.refusal : script.primingRefusal);
  json.close();
}

void printAsJson(const Fit& fit, const LoadedScript& loaded, const FitOptions& options) {
  JsonWriter json("fit");
  json.add("file", loaded.file.name());
  json.add("fits", fit.fits());
  addWaveforms(json, fit);
  json.addUsage("memoryBytes", loaded.builder.usedBytes(), options.generator.memorySizeBytes);
  json.add("largestFreeBytes", loaded.builder.largestFreeBytes());
  json.openArray("scripts");
  for (const ScriptFit& script : fit.scripts) addScript(json, script, loaded, options);
  json.close();
  json.finish();
}

}  // namespace

int fit(const FitOptions& options) {
  const auto loaded = loadScript(options.script, options.waveforms, options.generator, kLongestWaveform);
  if (!loaded) return kFailure;
  if (printWarnings(*loaded) && options.isStrict) return kFailure;
  const Fit fit = measure(*loaded, options.generator);
  for (const Diagnostic& diagnostic : fit.diagnostics) printDiagnostic(diagnostic, loaded->file);
  options.isJson ? printAsJson(fit, *loaded, options) : FitReport(fit, *loaded, options.generator).print();
  return fit.fits() ? kSuccess : kFailure;
}

}  // namespace tools::cli
