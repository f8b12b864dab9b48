#include <algorithm>
#include <nlohmann/json.hpp>

#include "cli/LoadedScript.h"
#include "cli/commands/commands.h"
#include "cli/console.h"
#include "ktcheckname/compareNames.h"
#include "tools/difference/compareScripts.h"
#include "tools/text/Refusal.h"
#include "tools/text/characters.h"
#include "tools/text/quantities.h"

namespace tools::cli {
namespace {

constexpr int kSame = 0;
constexpr int kDifferent = 1;
constexpr int kTrouble = 2;

std::unique_ptr<LoadedScript> load(const std::string& script, const DiffOptions& options) {
  auto loaded = loadScript(script, options.waveforms, options.generator, options.generator.memorySamples());
  return loaded && buildPrograms(*loaded) ? std::move(loaded) : nullptr;
}

ComparedFile sideOf(const LoadedScript& loaded) {
  return {loaded.file, loaded.builder, loaded.programs, [&loaded](const std::string& name) -> SampleSpan {
            const auto isIt = [&](const NamedWaveform& named) {
              return ktcheckname::compareNames(named.name, name) == 0;
            };
            return std::ranges::find_if(loaded.waveforms, isIt)->waveform.samples;
          }};
}

// A waveform that one of the files plays was not given in vain.
void printWarningsOf(LoadedScript& first, LoadedScript& second) {
  const auto onlyUnusedIn = [](std::vector<std::string>& unused, const std::vector<std::string>& others) {
    std::erase_if(unused, [&](const std::string& name) { return std::ranges::find(others, name) == others.end(); });
  };
  onlyUnusedIn(first.unusedWaveforms, second.unusedWaveforms);
  second.unusedWaveforms.clear();
  printWarnings(first);
  printWarnings(second);
}

std::string describeSample(const PlayDifference& difference, double sampleRateHz) {
  if (difference.sample == kBeyond) return "beyond 2^64 samples";
  return "at sample " + formatCount(difference.sample) + ", " +
         formatQuantity(static_cast<double>(difference.sample) / sampleRateHz, "s");
}

void printDifference(const ComparedScripts& scripts, const LoadedScript& first, const LoadedScript& second,
                     const DiffOptions& options) {
  if (scripts.first == nullptr || scripts.second == nullptr) {
    const LoadedScript& lacking = scripts.first == nullptr ? first : second;
    return print(toPrintable(scripts.name() + ": " + lacking.file.name() + " has no such script") + "\n");
  }
  const PlayDifference& difference = *scripts.plays.difference;
  print(toPrintable(scripts.name()) + ": they differ " + describeSample(difference, options.generator.sampleRateHz) +
        "\n");
  const DifferenceNote here = noteOf(difference.first, difference.kind, *scripts.first);
  const DifferenceNote there = noteOf(difference.second, difference.kind, *scripts.second);
  print(formatNote(first.file, here.place, here.message) + formatNote(second.file, there.place, there.message));
}

void printResult(const std::vector<ComparedScripts>& scripts, const LoadedScript& first, const LoadedScript& second,
                 const DiffOptions& options) {
  for (const ComparedScripts& pair : scripts) {
    if (!pair.areSame()) {
      printDifference(pair, first, second, options);
    } else if (!pair.plays.isWhole) {
      print(toPrintable(pair.name()) + ": the same for 2^64 samples; what comes then was not compared\n");
    }
  }
}

}  // namespace

int diff(const DiffOptions& options) try {
  const auto first = load(options.first, options);
  const auto second = load(options.second, options);
  if (!first || !second) return kTrouble;
  printWarningsOf(*first, *second);
  const auto scripts = compareScripts(sideOf(*first), sideOf(*second), options.name);
  if (options.isJson) {
    print(describeDifferences(scripts).dump() + "\n");
  } else {
    printResult(scripts, *first, *second, options);
  }
  flushOutput();
  return std::ranges::all_of(scripts, &ComparedScripts::areSame) ? kSame : kDifferent;
} catch (const Refusal& refusal) {
  printFailure(refusal);
  return kTrouble;
} catch (const std::bad_alloc&) {
  printFailure("there is not enough memory", "");
  return kTrouble;
}

}  // namespace tools::cli
