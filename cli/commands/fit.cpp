#include "tools/fit/Fit.h"

#include "cli/JsonWriter.h"
#include "cli/LoadedScript.h"
#include "cli/commands/commands.h"
#include "cli/commands/report.h"
#include "cli/console.h"
#include "tools/text/quantities.h"

namespace tools::cli {
namespace {

constexpr std::uint64_t kLongestWaveform = 0xFFFFFFFF;  // samples; what the library can count

std::vector<WaveformLength> lengthsOf(const LoadedScript& loaded) {
  std::vector<WaveformLength> lengths;
  for (const NamedWaveform& named : loaded.waveforms) {
    lengths.push_back({named.name, named.waveform.samples.size()});
  }
  return lengths;
}

// The rows for people.
class FitReport {
 public:
  explicit FitReport(const Fit& fit) : fit_(fit), generator_(fit.generator) {}

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
    const std::uint64_t all = generator_.memorySizeBytes;
    const auto tenths =
        static_cast<std::uint64_t>(1000.0 * static_cast<double>(fit_.usedBytes) / static_cast<double>(all));
    printRow("sample memory", formatCount(fit_.usedBytes) + " of " + formatCount(all) + " bytes (" +
                                  std::to_string(tenths / 10) + "." + std::to_string(tenths % 10) +
                                  " %), largest block left " + formatCount(fit_.largestFreeBytes) + " bytes");
  }

  void printScript(const ScriptFit& script) const {
    printRow("script", script.program.entry.script.name + ": " + formatCount(script.instructions()) + " of " +
                           formatCount(generator_.sequenceWords) + " instructions, plays " + script.plays);
    if (script.refusal) printRow("DOES NOT FIT", *script.refusal);
    if (script.primingRefusal) return printRow("DOES NOT FIT", *script.primingRefusal);
    const std::uint64_t samples = std::uint64_t{script.primingWords} * toHWTraits(generator_).samplesPerMemoryWord;
    printRow("priming", formatCount(script.primingWords) + " memory words, " + formatCount(samples) + " samples, of " +
                            formatCount(script.primingAsked) + " samples asked for");
  }

  const Fit& fit_;
  const GeneratorOptions& generator_;
};

void printAsJson(const Fit& fit, const std::string& file) {
  JsonWriter json("fit");
  json.add("file", file);
  addFit(fit, json);
  json.finish();
}

}  // namespace

int fit(const FitOptions& options) {
  const auto loaded = loadScript(options.script, options.waveforms, options.generator, kLongestWaveform);
  if (!loaded) return kFailure;
  if (printWarnings(*loaded) && options.isStrict) return kFailure;
  const Fit fit = measureFit(loaded->builder, lengthsOf(*loaded), options.generator);
  for (const Diagnostic& diagnostic : fit.diagnostics) printDiagnostic(diagnostic, loaded->file);
  options.isJson ? printAsJson(fit, loaded->file.name()) : FitReport(fit).print();
  return fit.fits() ? kSuccess : kFailure;
}

}  // namespace tools::cli
