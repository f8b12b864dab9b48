#include <algorithm>

#include "cli/LoadedScript.h"
#include "cli/commands/commands.h"
#include "cli/commands/report.h"
#include "cli/console.h"
#include "kterr/Exception.h"
#include "ktorba/hwRecords/conventions.h"
#include "ktorba/settings/SettingsCalculator.h"
#include "tools/diagnostics/elaboration.h"
#include "tools/program/listing.h"
#include "tools/text/Refusal.h"
#include "tools/text/quantities.h"

namespace tools::cli {
namespace {

constexpr std::uint64_t kLongestWaveform = 0xFFFFFFFF;  // samples; what the library can count

class FitReport {
 public:
  FitReport(LoadedScript& loaded, const FitOptions& options) : loaded_(loaded), options_(options) {}

  bool run() {
    printRow("generator", describe(options_.generator));
    placeWaveforms();
    printMemory();
    return buildScripts() && fits_;
  }

 private:
  void refuse(const std::string& message) {
    fits_ = false;
    printRow("DOES NOT FIT", message);
  }

  void placeWaveforms() {
    for (const NamedWaveform& named : loaded_.waveforms) {
      const std::uint64_t samples = named.waveform.samples.size();
      try {
        loaded_.builder.addWaveform(named.name, samples);
        printRow("waveform", named.name + ": " + formatCount(samples) + " samples, " +
                                 formatQuantity(static_cast<double>(samples) / options_.generator.sampleRateHz, "s"));
      } catch (const Refusal& error) {
        refuse(error.what());
        loaded_.builder.addUnplacedWaveform(named.name, samples);
      }
    }
  }

  void printMemory() const {
    const std::uint64_t used = loaded_.builder.usedBytes();
    const std::uint64_t all = options_.generator.memorySizeBytes;
    const auto tenths = static_cast<std::uint64_t>(1000.0 * static_cast<double>(used) / static_cast<double>(all));
    printRow("sample memory", formatCount(used) + " of " + formatCount(all) + " bytes (" + std::to_string(tenths / 10) +
                                  "." + std::to_string(tenths % 10) + " %), largest block left " +
                                  formatCount(loaded_.builder.largestFreeBytes()) + " bytes");
  }

  // False when a script cannot be built, which has been printed.
  bool buildScripts() {
    std::vector<Diagnostic> diagnostics;
    loaded_.programs = loaded_.builder.build(diagnostics);
    for (const Diagnostic& diagnostic : diagnostics) printDiagnostic(diagnostic, loaded_.file);
    for (const Program& program : loaded_.programs) reportScript(program);
    return diagnostics.empty();
  }

  void reportScript(const Program& program) {
    const std::uint64_t words = program.entry.instructionWords.size();
    const std::uint64_t capacity = options_.generator.sequenceWords;
    const std::string name = program.entry.script.name;
    printRow("script", name + ": " + formatCount(words) + " of " + formatCount(capacity) + " instructions, plays " +
                           describeDuration(program, loaded_.builder, options_.generator.sampleRateHz));
    if (words > capacity) {
      refuse("script " + name + " has " + formatCount(words - capacity) + " instructions too many");
    }
    reportPriming(program);
  }

  void reportPriming(const Program& program) {
    ktorba::GenerationSettings requested;
    const std::uint32_t perWord = loaded_.builder.traits().samplesPerMemoryWord;
    requested.primingDepth = options_.generator.primingDepthSamples > 0 ? options_.generator.primingDepthSamples
                                                                        : ktorba::kDefaultPrimingWords * perWord;
    requested.activeScriptLength = program.entry.finiteMemoryWords;
    ktorba::AdjustedSettings adjusted;
    ktorba::HWSettingsRecord hardware;
    try {
      ktorba::SettingsCalculator(loaded_.builder.traits())
          .calculateSettings(loaded_.builder.waveforms(), requested, adjusted, hardware);
      const std::uint32_t used = hardware.settings.primingDepthWords;
      printRow("priming", formatCount(used) + " memory words, " + formatCount(std::uint64_t{used} * perWord) +
                              " samples, of " + formatCount(requested.primingDepth) + " samples asked for");
    } catch (const kterr::Exception& error) {
      refuse(diagnoseFailure(error.code(), error.getJson()).message);
    }
  }

  LoadedScript& loaded_;
  const FitOptions& options_;
  bool fits_ = true;
};

}  // namespace

int fit(const FitOptions& options) {
  const auto loaded = loadScript(options.script, options.waveforms, options.generator, kLongestWaveform);
  if (!loaded) return kFailure;
  if (printWarnings(*loaded) && options.isStrict) return kFailure;
  return FitReport(*loaded, options).run() ? kSuccess : kFailure;
}

}  // namespace tools::cli
