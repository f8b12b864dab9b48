#include "tools/fit/Fit.h"

#include <algorithm>

#include "kterr/Exception.h"
#include "ktorba/settings/SettingsCalculator.h"
#include "tools/diagnostics/elaboration.h"
#include "tools/program/listing.h"
#include "tools/text/Refusal.h"
#include "tools/text/quantities.h"

namespace tools {
namespace {

// The session's own calculation of the priming depth.
void prime(const ProgramBuilder& builder, ScriptFit& fit) {
  ktorba::GenerationSettings requested;
  requested.primingDepth = fit.primingAsked;
  requested.activeScriptLength = fit.program.entry.finiteMemoryWords;
  ktorba::AdjustedSettings adjusted;
  ktorba::HWSettingsRecord hardware;
  try {
    ktorba::SettingsCalculator(builder.traits()).calculateSettings(builder.waveforms(), requested, adjusted, hardware);
    fit.primingWords = hardware.settings.primingDepthWords;
  } catch (const kterr::Exception& error) {
    fit.primingRefusal = diagnoseFailure(error.code(), error.getJson()).message;
  }
}

ScriptFit measureScript(Program program, const ProgramBuilder& builder, const GeneratorOptions& generator) {
  const std::uint32_t asked = generator.primingDepthSamples;
  const std::uint32_t usual = ktorba::kDefaultPrimingWords * builder.traits().samplesPerMemoryWord;
  ScriptFit fit;
  fit.program = std::move(program);
  fit.plays = describeDuration(fit.program, builder, generator.sampleRateHz);
  fit.samples = countPlayedSamples(fit.program, builder);
  fit.primingAsked = asked > 0 ? asked : usual;
  if (fit.instructions() > generator.sequenceWords) {
    fit.refusal = "script " + fit.program.entry.script.name + " has " +
                  formatCount(fit.instructions() - generator.sequenceWords) + " instructions too many";
  }
  prime(builder, fit);
  return fit;
}

void addWaveform(const WaveformFit& waveform, JsonWriter& json) {
  json.openObject();
  json.add("name", waveform.name);
  json.add("samples", waveform.samples);
  json.add("refusal", waveform.refusal);
  json.close();
}

void addScript(const ScriptFit& script, const GeneratorOptions& generator, JsonWriter& json) {
  json.openObject();
  json.add("name", script.program.entry.script.name);
  json.addUsage("instructions", script.instructions(), generator.sequenceWords);
  json.add("plays", script.plays);
  json.add("samples", script.samples);
  json.add("primingWords", script.primingWords);
  json.add("refusal", script.refusal ? script.refusal : script.primingRefusal);
  json.close();
}

}  // namespace

bool Fit::fits() const {
  const auto isRefused = [](const auto& part) { return part.refusal.has_value(); };
  const auto isNotPrimed = [](const ScriptFit& script) { return script.primingRefusal.has_value(); };
  return diagnostics.empty() && std::ranges::none_of(waveforms, isRefused) &&
         std::ranges::none_of(scripts, isRefused) && std::ranges::none_of(scripts, isNotPrimed);
}

WaveformFit placeWaveform(const WaveformLength& waveform, ProgramBuilder& builder) {
  WaveformFit fit = {waveform.name, waveform.samples, {}};
  try {
    builder.addWaveform(waveform.name, waveform.samples);
  } catch (const Refusal& refusal) {
    fit.refusal = refusal.what();
    builder.addUnplacedWaveform(waveform.name, waveform.samples);
  }
  return fit;
}

Fit measureFit(ProgramBuilder& builder, std::span<const WaveformLength> waveforms, const GeneratorOptions& generator) {
  Fit fit;
  fit.generator = generator;
  for (const WaveformLength& waveform : waveforms) fit.waveforms.push_back(placeWaveform(waveform, builder));
  fit.usedBytes = builder.usedBytes();
  fit.largestFreeBytes = builder.largestFreeBytes();
  for (Program& program : builder.build(fit.diagnostics)) {
    fit.scripts.push_back(measureScript(std::move(program), builder, generator));
  }
  return fit;
}

void addFit(const Fit& fit, JsonWriter& json) {
  json.add("fits", fit.fits());
  json.openArray("waveforms");
  for (const WaveformFit& waveform : fit.waveforms) addWaveform(waveform, json);
  json.close();
  json.addUsage("memoryBytes", fit.usedBytes, fit.generator.memorySizeBytes);
  json.add("largestFreeBytes", fit.largestFreeBytes);
  json.openArray("scripts");
  for (const ScriptFit& script : fit.scripts) addScript(script, fit.generator, json);
  json.close();
}

}  // namespace tools
