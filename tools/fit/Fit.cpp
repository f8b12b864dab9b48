#include "tools/fit/Fit.h"

#include <algorithm>

#include "conventions/conventions.h"
#include "ktcheckname/compareNames.h"
#include "kterr/Exception.h"
#include "ktorba/settings/SettingsCalculator.h"
#include "tools/diagnostics/elaboration.h"
#include "tools/text/Refusal.h"
#include "tools/text/durations.h"
#include "tools/text/nearMiss.h"
#include "tools/text/quantities.h"
#include "tools/timeline/describeLength.h"
#include "tools/timeline/raisedTriggers.h"

namespace tools {
namespace {

bool isCalled(const std::string& name, const std::string& other) { return ktcheckname::compareNames(name, other) == 0; }

// The session's own calculation. Returns why it refuses, or nothing.
std::optional<std::string> calculateSettings(const ProgramBuilder& builder, const ktorba::GenerationSettings& requested,
                                             ktorba::HWSettings& settings) {
  ktorba::AdjustedSettings adjusted;
  ktorba::HWSettingsRecord hardware;
  try {
    ktorba::SettingsCalculator(builder.traits()).calculateSettings(builder.waveforms(), requested, adjusted, hardware);
    settings = hardware.settings;
    return std::nullopt;
  } catch (const kterr::Exception& error) {
    return diagnoseFailure(error.code(), error.getJson()).message;
  }
}

PrimingFit measurePriming(const Program& program, const ProgramBuilder& builder, std::uint32_t askedSamples) {
  ktorba::GenerationSettings requested;
  requested.primingDepth = askedSamples;
  requested.activeScriptLength = program.entry.finiteMemoryWords;
  ktorba::HWSettings settings;
  PrimingFit priming;
  priming.askedSamples = askedSamples;
  priming.refusal = calculateSettings(builder, requested, settings);
  if (priming.refusal) return priming;
  priming.words = settings.primingDepthWords;
  priming.samples = std::uint64_t{priming.words} * builder.traits().samplesPerMemoryWord;
  priming.isWholeScript = priming.words == program.entry.finiteMemoryWords;
  return priming;
}

ScriptFit measureScript(Program program, const ProgramBuilder& builder, const GeneratorOptions& generator,
                        const StraightPlay& play, const std::vector<RaisedTrigger>& triggers) {
  const std::uint32_t asked = generator.primingDepthSamples;
  const std::uint32_t usual = ktorba::kDefaultPrimingWords * builder.traits().samplesPerMemoryWord;
  ScriptFit fit;
  fit.program = std::move(program);
  fit.length = fold(play, triggers).length;
  fit.priming = measurePriming(fit.program, builder, asked > 0 ? asked : usual);
  if (fit.instructions() > generator.sequenceWords) {
    fit.refusal = "script " + fit.program.entry.script.name + " has " +
                  formatCount(fit.instructions() - generator.sequenceWords) + " instructions too many";
  }
  return fit;
}

const WaveformFit& findWaveform(const Fit& fit, const std::string& name, const std::string& purpose) {
  const auto found = std::ranges::find_if(fit.waveforms, [&](const auto& known) { return isCalled(known.name, name); });
  if (found != fit.waveforms.end()) return *found;
  std::vector<std::string> names;
  for (const WaveformFit& waveform : fit.waveforms) names.push_back(waveform.name);
  throw Refusal("there is no waveform \"" + name + "\" to " + purpose, tellSimilar("waveform", name, names));
}

StreamingFit measureStreaming(const WaveformFit& waveform, const ProgramBuilder& builder) {
  StreamingFit fit = {waveform.name, waveform.samples, waveform.refusal};
  if (fit.refusal) return fit;
  ktorba::GenerationSettings requested;
  requested.primingDepth = 0;
  requested.streamingWaveformName = waveform.name;
  ktorba::HWSettings ignored;
  fit.refusal = calculateSettings(builder, requested, ignored);
  return fit;
}

void noteIdleTriggers(const std::vector<RaisedTrigger>& triggers, std::uint32_t awaited, Fit& fit) {
  for (const auto& [sample, trigger] : triggers) {
    if ((awaited & ktorba::clearFlagOf(trigger)) != 0) continue;
    awaited |= ktorba::clearFlagOf(trigger);
    fit.idleTriggers.push_back(ktorba::triggerName(trigger));
  }
}

void measureRequest(const FitRequest& request, const ProgramBuilder& builder, Fit& fit) {
  for (const std::string& name : request.cleared) fit.cleared.push_back(findWaveform(fit, name, "clear").name);
  if (request.streaming.empty()) return;
  fit.streaming = measureStreaming(findWaveform(fit, request.streaming, "stream"), builder);
}

void measureScripts(const std::vector<RaisedTrigger>& triggers, ProgramBuilder& builder, Fit& fit) {
  std::uint32_t awaited = 0;
  for (Program& program : builder.build(fit.diagnostics)) {
    const StraightPlay play(program, builder);
    awaited |= awaitedTriggers(play);
    fit.scripts.push_back(measureScript(std::move(program), builder, fit.generator, play, triggers));
  }
  // A script that could not be built may wait for any of them.
  if (fit.diagnostics.empty()) noteIdleTriggers(triggers, awaited, fit);
}

void addWaveform(const WaveformFit& waveform, JsonWriter& json) {
  json.openObject();
  json.add("name", waveform.name);
  json.add("samples", waveform.samples);
  json.add("refusal", waveform.refusal);
  json.close();
}

void addBlock(const MappedBlock& block, JsonWriter& json) {
  json.openObject();
  json.add("waveform", block.isHole() ? std::nullopt : std::optional(block.waveform));
  json.add("firstByte", block.firstByte);
  json.add("bytes", block.bytes);
  json.add("samples", block.samples);
  json.close();
}

void addMemoryMap(const MemoryMap& map, JsonWriter& json) {
  json.openObject("memoryMap", JsonWriter::Shape::kTall);
  json.openArray("blocks");
  for (const MappedBlock& block : map.blocks()) addBlock(block, json);
  json.close();
  json.add("freeBytes", map.freeBytes());
  json.add("unusableBytes", map.unusableBytes());
  json.add("holes", map.holeCount());
  json.add("largestHoleBytes", map.largestHoleBytes());
  json.add("fragmentation", map.fragmentation());
  if (const auto longest = map.longest()) {
    json.openObject("longest");
    json.add("waveform", longest->waveform);
    json.add("moreSamples", longest->samples);
    json.close();
  } else {
    json.addBare("longest", "null");
  }
  json.close();
}

void addStreaming(const Fit& fit, JsonWriter& json) {
  if (!fit.streaming) return json.addBare("streaming", "null");
  json.openObject("streaming");
  json.add("waveform", fit.streaming->waveform);
  json.add("samples", fit.streaming->samples);
  json.add("seconds", secondsOf(fit.streaming->samples, fit.generator.sampleRateHz));
  json.add("refusal", fit.streaming->refusal);
  json.close();
}

const char* nameOf(PlayLength::Kind kind) {
  switch (kind) {
    case PlayLength::Kind::kExact:
      return "exact";
    case PlayLength::Kind::kEndless:
      return "endless";
    case PlayLength::Kind::kWaiting:
      return "waiting";
    default:
      return "tooLong";
  }
}

// A number of samples is a text, since it may have more digits than readers of JSON keep.
void addLength(const PlayLength& length, const Program& program, double sampleRateHz, JsonWriter& json) {
  json.openObject("plays");
  json.add("kind", nameOf(length.kind()));
  if (const auto samples = length.samples()) {
    json.add("samples", std::to_string(*samples));
    json.add("seconds", secondsOf(*samples, sampleRateHz));
  }
  if (length.kind() == PlayLength::Kind::kWaiting) {
    const Place& place = program.places[length.address()];
    json.add("trigger", ktorba::triggerName(length.trigger()));
    json.add("inLoop", waitsInLoop(length, program));
    json.add("line", place.line);
    json.add("column", place.position);
    json.add("sinceSample", std::to_string(length.waitingSince()));
    json.add("sinceSeconds", secondsOf(length.waitingSince(), sampleRateHz));
  }
  json.close();
}

void addScript(const ScriptFit& script, const GeneratorOptions& generator, JsonWriter& json) {
  json.openObject();
  json.add("name", script.program.entry.script.name);
  json.addUsage("instructions", script.instructions(), generator.sequenceWords);
  addLength(script.length, script.program, generator.sampleRateHz, json);
  json.add("primingWords", script.priming.words);
  json.add("primingSamples", script.priming.samples);
  json.add("primingSeconds", secondsOf(script.priming.samples, generator.sampleRateHz));
  json.add("primesWholeScript", script.priming.isWholeScript);
  json.add("refusal", script.refusal ? script.refusal : script.priming.refusal);
  json.close();
}

}  // namespace

bool Fit::fits() const {
  const auto isRefused = [](const WaveformFit& waveform) { return waveform.refusal.has_value(); };
  return diagnostics.empty() && std::ranges::none_of(waveforms, isRefused) &&
         std::ranges::all_of(scripts, &ScriptFit::fits) && !(streaming && streaming->refusal);
}

MemoryMap Fit::memoryMap() const {
  std::vector<MappedBlock> placed;
  for (const WaveformFit& waveform : waveforms) {
    const auto isIt = [&](const std::string& name) { return isCalled(name, waveform.name); };
    if (waveform.refusal || std::ranges::any_of(cleared, isIt)) continue;
    placed.push_back({waveform.name, waveform.firstByte, waveform.bytes, waveform.samples});
  }
  return {std::move(placed), generator.memorySizeBytes, generator.memoryWordBytes, generator.bytesPerSample()};
}

WaveformFit placeWaveform(const WaveformLength& waveform, ProgramBuilder& builder) {
  WaveformFit fit = {waveform.name, waveform.samples, {}};
  try {
    const std::uint64_t before = builder.usedBytes();
    fit.firstByte = builder.addWaveform(waveform.name, waveform.samples).memoryOffset;
    fit.bytes = builder.usedBytes() - before;
  } catch (const Refusal& refusal) {
    fit.refusal = refusal.what();
    builder.addUnplacedWaveform(waveform.name, waveform.samples);
  }
  return fit;
}

Fit measureFit(ProgramBuilder& builder, std::span<const WaveformLength> waveforms, const GeneratorOptions& generator,
               const FitRequest& request) {
  Fit fit;
  fit.generator = generator;
  for (const WaveformLength& waveform : waveforms) fit.waveforms.push_back(placeWaveform(waveform, builder));
  fit.usedBytes = builder.usedBytes();
  fit.largestFreeBytes = builder.largestFreeBytes();
  measureRequest(request, builder, fit);
  measureScripts(request.triggers, builder, fit);
  return fit;
}

void addFit(const Fit& fit, JsonWriter& json) {
  json.add("fits", fit.fits());
  json.openArray("waveforms");
  for (const WaveformFit& waveform : fit.waveforms) addWaveform(waveform, json);
  json.close();
  json.addUsage("memoryBytes", fit.usedBytes, fit.generator.memorySizeBytes);
  json.add("largestFreeBytes", fit.largestFreeBytes);
  addMemoryMap(fit.memoryMap(), json);
  addStreaming(fit, json);
  json.openArray("scripts");
  for (const ScriptFit& script : fit.scripts) addScript(script, fit.generator, json);
  json.close();
  json.openArray("idleTriggers", JsonWriter::Shape::kFlat);
  for (const std::string& trigger : fit.idleTriggers) json.add({}, trigger);
  json.close();
}

}  // namespace tools
