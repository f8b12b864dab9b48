#include "cli/commands/playSummary.h"

#include <algorithm>

#include "cli/JsonWriter.h"
#include "cli/commands/report.h"
#include "conventions/conventions.h"
#include "tools/text/quantities.h"

namespace tools::cli {
namespace {

std::string describeMarkers(const ComputedPlay& play) {
  std::string text;
  for (const unsigned marker : usedMarkers(play.header())) {
    text += (text.empty() ? "" : ", ") + ktorba::markerName(marker) + " \u00d7 " + formatCount(play.samplesAt(marker));
  }
  return text.empty() ? "none fired" : text;
}

std::string describeTriggers(const RecordingHeader& header) {
  constexpr std::size_t kMostListed = 8;
  std::string text;
  for (std::size_t i = 0; i < std::min(kMostListed, header.triggers.size()); ++i) {
    const TriggerEvent& event = header.triggers[i];
    text += (i == 0 ? "" : ", ") + ktorba::triggerName(event.trigger) + " at " +
            formatQuantity(static_cast<double>(event.sample) / header.sampleRateHz, "s");
  }
  if (header.triggers.size() > kMostListed) {
    text += " and " + formatCount(header.triggers.size() - kMostListed) + " more";
  }
  return text.empty() ? "none raised" : text;
}

std::uint64_t countClipped(const LoadedScript& loaded) {
  std::uint64_t clipped = 0;
  for (const NamedWaveform& named : loaded.waveforms) clipped += named.waveform.clippedSamples;
  return clipped;
}

std::string describeClipping(std::uint64_t clipped) {
  return clipped == 0 ? "none" : formatCount(clipped) + " samples of the waveforms";
}

std::string describeEnding(const ComputedPlay& play) {
  const std::uint64_t first = play.header().firstSample;
  const std::string from = first == 0 ? "" : ", from sample " + formatCount(first);
  switch (play.ending()) {
    case PlayEnding::kEnd:
      return from + ", to the end";
    case PlayEnding::kLimit:
      return from + ", stopped at the limit";
    case PlayEnding::kWindow:
      break;
  }
  return from + ", as long as asked for";
}

const char* textOf(PlayEnding ending) {
  return ending == PlayEnding::kEnd ? "end" : ending == PlayEnding::kLimit ? "limit" : "window";
}

std::string describePlayed(const ComputedPlay& play) {
  const RecordingHeader& header = play.header();
  return formatCount(header.sampleCount) + " samples, " +
         formatQuantity(static_cast<double>(header.sampleCount) / header.sampleRateHz, "s") + " at " +
         formatQuantity(header.sampleRateHz, "S/s") + describeEnding(play);
}

void addPlayed(JsonWriter& json, const ComputedPlay& play) {
  const RecordingHeader& header = play.header();
  json.add("firstSample", header.firstSample);
  json.add("samples", header.sampleCount);
  json.add("sampleRateHz", header.sampleRateHz);
  json.add("ending", textOf(play.ending()));
  const auto& wait = play.unmetWait();
  json.add("awaitedTrigger", wait ? std::optional(ktorba::triggerName(wait->trigger)) : std::nullopt);
  json.add("awaitedAtInstruction", wait ? std::optional(wait->address) : std::nullopt);
}

void addEvents(JsonWriter& json, const ComputedPlay& play) {
  const RecordingHeader& header = play.header();
  json.openArray("markers");
  for (const unsigned marker : usedMarkers(header)) {
    json.openObject();
    json.add("name", ktorba::markerName(marker));
    json.add("count", play.samplesAt(marker));
    json.close();
  }
  json.close();
  json.openArray("triggers");
  for (const TriggerEvent& event : header.triggers) {
    json.openObject();
    json.add("name", ktorba::triggerName(event.trigger));
    json.add("sample", event.sample);
    json.close();
  }
  json.close();
}

}  // namespace

void printSummary(const PlaySummary& summary) {
  const auto& [play, loaded, program, options, isComputed, tookMs] = summary;
  const std::size_t scripts = loaded.programs.size();
  printRow("script", play.scriptName() + (scripts == 1 ? "" : ", one of " + std::to_string(scripts)) + ": " +
                         formatCount(program.entry.instructionWords.size()) + " of " +
                         formatCount(options.generator.sequenceWords) + " instructions");
  printRow("memory", formatCount(loaded.builder.usedBytes()) + " of " + formatCount(options.generator.memorySizeBytes) +
                         " bytes of samples");
  printRow("played", describePlayed(play));
  printRow("markers", describeMarkers(play));
  printRow("triggers", describeTriggers(play.header()));
  printRow("clipped", describeClipping(countClipped(loaded)));
  for (const std::string& output : options.outputs.paths) printRow("wrote", output);
  printRow("took", formatQuantity(static_cast<double>(tookMs) / 1000, "s"));
  if (play.unmetWait()) printRow("unfinished", play.unmetWait()->describe());
}

void printSummaryAsJson(const PlaySummary& summary) {
  const auto& [play, loaded, program, options, isComputed, tookMs] = summary;
  JsonWriter json("play");
  json.add("file", loaded.file.name());
  json.add("script", play.scriptName());
  json.addUsage("instructions", program.entry.instructionWords.size(), options.generator.sequenceWords);
  json.addUsage("memoryBytes", loaded.builder.usedBytes(), options.generator.memorySizeBytes);
  addPlayed(json, play);
  json.add("computed", isComputed);
  addEvents(json, play);
  json.add("clippedSamples", countClipped(loaded));
  json.openArray("outputs");
  for (const std::string& output : options.outputs.paths) json.add({}, output);
  json.close();
  json.add("milliseconds", tookMs);
  json.finish();
}

}  // namespace tools::cli
