#include <memory>
#include <utility>

#include "cli/LoadedScript.h"
#include "cli/commands/ComputedPlay.h"
#include "cli/commands/SimulatedPlay.h"
#include "cli/commands/commands.h"
#include "cli/commands/outputPlaces.h"
#include "cli/commands/page.h"
#include "cli/commands/playSummary.h"
#include "cli/console.h"
#include "platform/system/clock.h"
#include "tools/outputs/Output.h"
#include "tools/outputs/OutputFile.h"
#include "tools/player/simulatedGenerator.h"
#include "tools/text/Refusal.h"
#include "tools/text/quantities.h"

namespace tools::cli {
namespace {

constexpr std::uint64_t kLargeBytes = 100'000'000;  // of a file; from here on its size is told before it is written

std::string inBytes(std::uint64_t bytes) { return formatQuantity(static_cast<double>(bytes), "B"); }

// Says what is going to be large, and what may not fit.
void announce(const std::vector<OutputSize>& sizes) {
  for (const auto& [path, least, greatest, freeBytes] : sizes) {
    if (least >= kLargeBytes) {
      printError("ktorba: note: " + path + (least == greatest ? " will take " : " will take at least ") +
                 inBytes(least) + "\n");
    }
    if (!freeBytes || greatest == UINT64_MAX || greatest <= *freeBytes) continue;
    printError("ktorba: warning: " + path + " may take up to " + inBytes(greatest) + ", and its disk has " +
               inBytes(*freeBytes) + " free\n");
  }
}

void openOutputs(Outputs& outputs, const RecordingHeader& header) {
  outputs.requireRoom(header);
  announce(outputs.sizes(header));
  outputs.open(header);
}

bool isComputed(const PlayOptions& options) {
  return options.isComputed || !options.window.from.empty() || !options.window.length.empty();
}

void compute(const ComputedPlay& play, Outputs& outputs) {
  printError("ktorba: note: what plays is computed rather than simulated\n");
  ProgressBar bar("writing");
  play.perform(outputs, [&bar](double fraction) { bar.show(fraction); });
}

// False when it failed, which has been printed.
bool simulate(const PlayOptions& options, const LoadedScript& loaded, const ComputedPlay& expected, Outputs& outputs) {
  std::unique_ptr<SimulatedPlay> play;
  try {
    play = std::make_unique<SimulatedPlay>(options.generator, loaded, expected);
    play->perform(outputs);
    return true;
  } catch (CallFailure& failure) {
    if (play && !failure.diagnostic.place.isKnown()) play->locate(failure.diagnostic);
    printDiagnostic(failure.diagnostic, loaded.file);
    return false;
  }
}

}  // namespace

int play(const PlayOptions& options) {
  const std::uint64_t startMs = platform::monotonicMilliseconds();
  checkOptions(options.generator);
  const std::vector<OutputPlace> all = placesOf(options.outputs);
  const std::vector<OutputPlace> pages = takePages(all);
  const std::vector<OutputPlace> places = takeOthers(all);
  for (const OutputPlace& place : places) {
    checkOutput(place, options.generator.sampleWidthBits, options.generator.sampleRateHz);
  }
  for (const OutputPlace& page : pages) checkPlace(page.path);
  takeStandardOutput(all);
  const auto loaded =
      loadScript(options.script, options.waveforms, options.generator, options.generator.memorySamples());
  if (!loaded) return kFailure;
  refuseSources(options.outputs.paths, options.script, options.waveforms, *loaded);
  if (printWarnings(*loaded) && options.isStrict) return kFailure;
  if (!buildPrograms(*loaded)) return kFailure;
  const Program& program = findProgram(*loaded, options.name);
  ComputedPlay computed(options.window, options.generator, *loaded, program);
  requireUse(computed.triggers(), triggersUsedBy(computed.timeline().play()));
  if (!options.title.empty()) computed.setTitle(options.title);
  Outputs outputs(places);
  openOutputs(outputs, computed.header());
  if (isComputed(options)) {
    compute(computed, outputs);
  } else if (!simulate(options, *loaded, computed, outputs)) {
    return kFailure;
  }
  outputs.finish();
  for (const OutputPlace& page : pages) {
    writePageFile(page.path, computed.header().title, *loaded, program, options.generator, computed.triggers());
  }
  if (const auto& wait = computed.unmetWait()) printDiagnostic(computed.diagnose(*wait), loaded->file);
  const PlaySummary summary = {
      computed, *loaded, program, options, isComputed(options), platform::monotonicMilliseconds() - startMs};
  options.isJson ? printSummaryAsJson(summary) : printSummary(summary);
  return kSuccess;
}

}  // namespace tools::cli
