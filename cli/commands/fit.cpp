#include <algorithm>

#include "cli/UserError.h"
#include "cli/commands/commands.h"
#include "cli/commands/report.h"
#include "cli/console.h"
#include "cli/diagnostics/elaboration.h"
#include "cli/program/Assembly.h"
#include "cli/program/listing.h"
#include "cli/quantities.h"
#include "kterr/Exception.h"
#include "ktorba/hwRecords/conventions.h"
#include "ktorba/settings/SettingsCalculator.h"

namespace cli {
namespace {

constexpr std::uint64_t kLongestWaveform = 0xFFFFFFFF;  // samples; what the library can count

class FitReport {
 public:
  FitReport(Assembly& assembly, const FitOptions& options) : assembly_(assembly), options_(options) {}

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
    for (const NamedWaveform& named : assembly_.waveforms) {
      const std::uint64_t samples = named.waveform.samples.size();
      try {
        assembly_.workbench.addWaveform(named.name, samples);
        printRow("waveform", named.name + ": " + formatCount(samples) + " samples, " +
                                 formatQuantity(static_cast<double>(samples) / options_.generator.sampleRateHz, "s"));
      } catch (const UserError& error) {
        refuse(error.what());
        assembly_.workbench.addUnplacedWaveform(named.name, samples);
      }
    }
  }

  void printMemory() const {
    const std::uint64_t used = assembly_.workbench.usedBytes();
    const std::uint64_t all = options_.generator.memorySizeBytes;
    const auto tenths = static_cast<std::uint64_t>(1000.0 * static_cast<double>(used) / static_cast<double>(all));
    printRow("sample memory", formatCount(used) + " of " + formatCount(all) + " bytes (" + std::to_string(tenths / 10) +
                                  "." + std::to_string(tenths % 10) + " %), largest block left " +
                                  formatCount(assembly_.workbench.largestFreeBytes()) + " bytes");
  }

  // False when a script cannot be built, which has been printed.
  bool buildScripts() {
    std::vector<Diagnostic> diagnostics;
    assembly_.programs = assembly_.workbench.build(diagnostics);
    for (const Diagnostic& diagnostic : diagnostics) printError(formatDiagnostic(diagnostic, assembly_.file));
    for (const Program& program : assembly_.programs) reportScript(program);
    return diagnostics.empty();
  }

  void reportScript(const Program& program) {
    const std::uint64_t words = program.entry.instructionWords.size();
    const std::uint64_t capacity = options_.generator.sequenceWords;
    const std::string name = program.entry.script.name;
    printRow("script", name + ": " + formatCount(words) + " of " + formatCount(capacity) + " instructions, plays " +
                           describeDuration(program, assembly_.workbench, options_.generator.sampleRateHz));
    if (words > capacity) {
      refuse("script " + name + " has " + formatCount(words - capacity) + " instructions too many");
    }
    reportPriming(program);
  }

  void reportPriming(const Program& program) {
    ktorba::GenerationSettings requested;
    const std::uint32_t perWord = assembly_.workbench.traits().samplesPerMemoryWord;
    requested.primingDepth = options_.generator.primingDepthSamples > 0 ? options_.generator.primingDepthSamples
                                                                        : ktorba::kDefaultPrimingWords * perWord;
    requested.activeScriptLength = program.entry.finiteMemoryWords;
    ktorba::AdjustedSettings adjusted;
    ktorba::HWSettingsRecord hardware;
    try {
      ktorba::SettingsCalculator(assembly_.workbench.traits())
          .calculateSettings(assembly_.workbench.waveforms(), requested, adjusted, hardware);
      const std::uint32_t used = hardware.settings.primingDepthWords;
      printRow("priming", formatCount(used) + " memory words, " + formatCount(std::uint64_t{used} * perWord) +
                              " samples, of " + formatCount(requested.primingDepth) + " samples asked for");
    } catch (const kterr::Exception& error) {
      refuse(diagnoseFailure(error.code(), error.getJson()).message);
    }
  }

  Assembly& assembly_;
  const FitOptions& options_;
  bool fits_ = true;
};

}  // namespace

int fit(const FitOptions& options) {
  const auto assembly = loadAssembly(options.script, options.waveforms, options.generator, kLongestWaveform);
  if (!assembly) return kFailure;
  printWarnings(*assembly);
  return FitReport(*assembly, options).run() ? kSuccess : kFailure;
}

}  // namespace cli
