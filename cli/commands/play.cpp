#include "cli/commands/Play.h"

#include <memory>
#include <utility>

#include "cli/LoadedScript.h"
#include "cli/commands/commands.h"
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

void checkOutputs(const PlayOptions& options) {
  bool isOutputTaken = false;
  for (const std::string& output : options.outputs) {
    if (isPage(output)) {
      checkPlace(output);
      continue;
    }
    checkOutput({output, options.outputFormat}, options.generator.sampleWidthBits, options.generator.sampleRateHz);
    if (!isStandardOutput(output)) continue;
    if (std::exchange(isOutputTaken, true)) throw Refusal("the standard output can take one output only");
    leaveOutputToData();
  }
}

std::vector<OutputPlace> placesOf(const PlayOptions& options) {
  std::vector<OutputPlace> places;
  for (const std::string& output : options.outputs) {
    if (!isPage(output)) places.push_back({output, options.outputFormat});
  }
  return places;
}

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

void writeOutputs(Play& play, Outputs& outputs) {
  outputs.requireRoom(play.header());
  announce(outputs.sizes(play.header()));
  outputs.open(play.header());
  play.perform(outputs);
  outputs.finish();
}

void writePages(const PlayOptions& options, const Play& play, const LoadedScript& loaded, const Program& program) {
  for (const std::string& output : options.outputs) {
    if (!isPage(output)) continue;
    writePageFile(output, play.header().title, loaded, program, options.generator, play.triggers());
  }
}

// Null when it failed, which has been printed.
std::unique_ptr<Play> playThrough(const PlayOptions& options, const LoadedScript& loaded, const Program& program) {
  const std::vector<OutputPlace> places = placesOf(options);
  Outputs outputs(places);
  std::unique_ptr<Play> play;
  try {
    play = std::make_unique<Play>(options, loaded, program);
    play->rehearse([&outputs](const RecordingHeader& header) { outputs.requireRoom(header); });
    if (!places.empty()) writeOutputs(*play, outputs);
    return play;
  } catch (CallFailure& failure) {
    if (play && !failure.diagnostic.place.isKnown()) play->locate(failure.diagnostic);
    printDiagnostic(failure.diagnostic, loaded.file);
    return nullptr;
  }
}

}  // namespace

int play(const PlayOptions& options) {
  const std::uint64_t startMs = platform::monotonicMilliseconds();
  checkOptions(options.generator);
  checkOutputs(options);
  const auto loaded =
      loadScript(options.script, options.waveforms, options.generator, options.generator.memorySamples());
  if (!loaded) return kFailure;
  refuseSources(options.outputs, options.script, options.waveforms, *loaded);
  if (printWarnings(*loaded) && options.isStrict) return kFailure;
  if (!buildPrograms(*loaded)) return kFailure;
  const Program& program = findProgram(*loaded, options.name);
  const auto running = playThrough(options, *loaded, program);
  if (!running) return kFailure;
  writePages(options, *running, *loaded, program);
  if (const auto& wait = running->unmetWait()) printDiagnostic(running->diagnose(*wait), loaded->file);
  const PlaySummary summary = {*running, *loaded, program, options, platform::monotonicMilliseconds() - startMs};
  options.isJson ? printSummaryAsJson(summary) : printSummary(summary);
  return kSuccess;
}

}  // namespace tools::cli
