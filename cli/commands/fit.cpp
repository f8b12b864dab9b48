#include "tools/fit/Fit.h"

#include <algorithm>
#include <array>

#include "cli/JsonWriter.h"
#include "cli/LoadedScript.h"
#include "cli/commands/commands.h"
#include "cli/commands/report.h"
#include "cli/console.h"
#include "platform/system/terminal.h"
#include "tools/fit/describeMemory.h"
#include "tools/fit/drawMemoryMap.h"
#include "tools/outputs/OutputFile.h"
#include "tools/text/Refusal.h"
#include "tools/text/characters.h"
#include "tools/text/durations.h"
#include "tools/text/quantities.h"
#include "tools/text/words.h"
#include "tools/timeline/describeLength.h"
#include "tools/timeline/raisedTriggers.h"

namespace tools::cli {
namespace {

constexpr std::uint64_t kLongestWaveform = 0xFFFFFFFF;  // samples; what the library can count
constexpr std::size_t kMostListed = 10;                 // waveforms that are told one by one
constexpr int kColumnsInFiles = 80;                     // of what is no terminal

std::vector<WaveformLength> lengthsOf(const LoadedScript& loaded) {
  std::vector<WaveformLength> lengths;
  for (const NamedWaveform& named : loaded.waveforms) {
    lengths.push_back({named.name, named.waveform.samples.size()});
  }
  return lengths;
}

std::string padLeft(const std::string& text, std::size_t width) {
  const std::size_t shown = toCharacters(text).size();
  return std::string(width - std::min(width, shown), ' ') + text;
}

using MapRow = std::array<std::string, 4>;  // three numbers and a name
using MapWidths = std::array<std::size_t, 3>;

std::string alignRow(const MapRow& row, const MapWidths& widths) {
  std::string text;
  for (std::size_t i = 0; i < widths.size(); ++i) text += padLeft(row[i], widths[i]) + "  ";
  return text + row.back();
}

// The rows for people.
class FitReport {
 public:
  explicit FitReport(const Fit& fit) : fit_(fit), generator_(fit.generator), map_(fit.memoryMap()) {}

  void print(bool isMapped) const {
    printRow("generator", describe(generator_));
    printWaveforms();
    printMemory();
    if (isMapped) printMap();
    if (fit_.streaming) printStreaming(*fit_.streaming);
    for (const ScriptFit& script : fit_.scripts) printScript(script);
  }

 private:
  std::string lasts(std::uint64_t samples) const {
    return formatCount(samples) + " samples, " + formatDuration(samples, generator_.sampleRateHz);
  }

  void printWaveforms() const {
    const bool areListed = fit_.waveforms.size() <= kMostListed;
    for (const WaveformFit& waveform : fit_.waveforms) {
      if (waveform.refusal) printRow("DOES NOT FIT", *waveform.refusal);
      if (areListed && !waveform.refusal) printRow("waveform", waveform.name + ": " + lasts(waveform.samples));
    }
    if (!areListed) printSum();
  }

  void printSum() const {
    std::uint64_t samples = 0;
    for (const WaveformFit& waveform : fit_.waveforms) samples += waveform.samples;
    printRow("waveforms", formatCount(fit_.waveforms.size()) + ": " + lasts(samples) + " together; --map tells each");
  }

  void printMemory() const {
    const std::size_t cleared = fit_.cleared.size();
    const std::string when = cleared == 0   ? ""
                             : cleared == 1 ? " once " + fit_.cleared.front() + " is cleared"
                                            : " once " + formatCount(cleared) + " waveforms are cleared";
    printRow("sample memory", describeUse(map_) + when + ", " + describeHoles(map_));
    const std::string longest = describeLongest(map_);
    if (!longest.empty()) printRow("", longest);
  }

  void printMap() const {
    std::vector<MapRow> rows = {{"first byte", "bytes", "samples", "waveform"}};
    for (const MappedBlock& block : map_.blocks()) {
      rows.push_back({formatCount(block.firstByte), formatCount(block.bytes), formatCount(block.samples),
                      block.isHole() ? "(free)" : block.waveform});
    }
    MapWidths widths{};
    for (const MapRow& row : rows) {
      for (std::size_t i = 0; i < widths.size(); ++i) widths[i] = std::max(widths[i], toCharacters(row[i]).size());
    }
    for (std::size_t i = 0; i < rows.size(); ++i) printRow(i == 0 ? "memory map" : "", alignRow(rows[i], widths));
    const int columns = platform::isTerminal(stdout) ? platform::terminalColumns(stdout) - 1 : kColumnsInFiles;
    printRow("", memoryBar(map_, columns - kLabelColumn));
  }

  void printStreaming(const StreamingFit& streaming) const {
    if (streaming.refusal) return printRow("CANNOT STREAM", streaming.waveform + ": " + *streaming.refusal);
    const double bytesPerSecond = generator_.sampleRateHz * generator_.bytesPerSample();
    printRow("streaming", streaming.waveform + ": the full ring lasts " +
                              formatDuration(streaming.samples, generator_.sampleRateHz) +
                              "; played without pause it takes " + formatQuantity(bytesPerSecond, "B/s"));
  }

  void printScript(const ScriptFit& script) const {
    printRow("script", script.program.entry.script.name + ": " + formatCount(script.instructions()) + " of " +
                           formatCount(generator_.sequenceWords) + " instructions, " +
                           describeLength(script.length, script.program, generator_.sampleRateHz));
    if (script.refusal) printRow("DOES NOT FIT", *script.refusal);
    const PrimingFit& priming = script.priming;
    priming.refusal ? printRow("DOES NOT FIT", *priming.refusal) : printRow("priming", describePriming(priming));
  }

  std::string describePriming(const PrimingFit& priming) const {
    const std::string text = "reads " + formatCount(priming.words) + " memory words ahead, at most " +
                             formatCount(priming.samples) + " samples (" +
                             formatDuration(priming.samples, generator_.sampleRateHz) + ")";
    const std::string asked = formatCount(priming.askedSamples) + " samples were asked for";
    if (priming.isWholeScript) return text + ": all of the script; " + asked;
    return priming.samples == priming.askedSamples ? text : text + "; " + asked;
  }

  const Fit& fit_;
  const GeneratorOptions& generator_;
  MemoryMap map_;
};

void printAsJson(const Fit& fit, const std::string& file) {
  JsonWriter json("fit");
  json.add("file", file);
  addFit(fit, json);
  json.finish();
}

bool isSvg(const std::string& path) {
  std::string ending = path.substr(path.size() - std::min<std::size_t>(4, path.size()));
  std::ranges::transform(ending, ending.begin(), toLower);
  return ending == ".svg";
}

void checkMapOutput(const std::string& path) {
  if (path.empty()) return;
  if (isStandardOutput(path)) return leaveOutputToData();
  if (!isSvg(path)) throw Refusal(path + ": the map of sample memory is drawn as .svg alone");
  checkPlace(path);
}

void writeMap(const Fit& fit, const std::string& title, const std::string& path) {
  try {
    OutputFile file(path);
    const std::string picture = drawMemoryMap(fit, title);
    file.write(picture.data(), picture.size());
    file.commit();
  } catch (const ReaderGone&) {  // then nobody misses the rest
  }
}

// Returns whether there was any.
bool warnAboutTriggers(const Fit& fit) {
  for (const std::string& trigger : fit.idleTriggers) {
    printError("ktorba: warning: " + trigger + " is raised, and no script waits for it\n");
  }
  return !fit.idleTriggers.empty();
}

}  // namespace

int fit(const FitOptions& options) {
  checkMapOutput(options.output);
  const auto loaded = loadScript(options.script, options.waveforms, options.generator, kLongestWaveform);
  if (!loaded) return kFailure;
  if (!options.output.empty()) refuseSources({options.output}, options.script, options.waveforms, *loaded);
  if (printWarnings(*loaded) && options.isStrict) return kFailure;
  const FitRequest request = {readTriggers(options.triggers, options.generator.sampleRateHz), options.cleared,
                              options.streaming};
  const Fit fit = measureFit(loaded->builder, lengthsOf(*loaded), options.generator, request);
  if (warnAboutTriggers(fit) && options.isStrict) return kFailure;
  for (const Diagnostic& diagnostic : fit.diagnostics) printDiagnostic(diagnostic, loaded->file);
  if (!options.output.empty()) writeMap(fit, "Sample memory of " + loaded->file.name(), options.output);
  options.isJson ? printAsJson(fit, loaded->file.name()) : FitReport(fit).print(options.isMapped);
  return fit.fits() ? kSuccess : kFailure;
}

}  // namespace tools::cli
