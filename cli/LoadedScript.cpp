#include "cli/LoadedScript.h"

#include <algorithm>
#include <filesystem>
#include <map>
#include <set>

#include "cli/console.h"
#include "ktWfmScriptCompiler/ByteClass.h"
#include "ktcheckname/compareNames.h"
#include "platform/system/paths.h"
#include "tools/check/checkText.h"
#include "tools/outputs/OutputFile.h"
#include "tools/player/simulatedGenerator.h"
#include "tools/text/Refusal.h"
#include "tools/text/characters.h"
#include "tools/text/nearMiss.h"
#include "tools/text/quantities.h"
#include "tools/text/words.h"

namespace tools::cli {
namespace {

using Sources = std::map<std::string, std::string, ktcheckname::NameLess>;

std::vector<std::string> namesOf(const Sources& sources) {
  std::vector<std::string> names;
  for (const auto& [name, source] : sources) names.push_back(name);
  return names;
}

Sources collectGiven(const WaveformOptions& options) {
  Sources sources;
  for (const std::string& argument : options.given) {
    const NamedSource named = parseNamedSource(argument);
    if (!sources.emplace(named.name, named.source).second) {
      throw Refusal("waveform \"" + named.name + "\" is given twice");
    }
  }
  return sources;
}

// What was given by name goes before what is found in folders, where only files of wanted names are opened: folders of
// recordings are large.
Sources collectSources(const WaveformOptions& options, const std::vector<std::string>& wanted) {
  const Sources given = collectGiven(options);
  const std::set<std::string, ktcheckname::NameLess> names(wanted.begin(), wanted.end());
  Sources found;
  for (const std::string& folder : options.folders) {
    for (const NamedSource& named : listFolder(folder)) {
      if (given.contains(named.name) || !names.contains(named.name) || !isSoundSource(named.source)) continue;
      const auto [entry, isNew] = found.emplace(named.name, named.source);
      if (!isNew) throw Refusal("waveform \"" + named.name + "\" is both " + entry->second + " and " + named.source);
    }
  }
  found.insert(given.begin(), given.end());
  return found;
}

// To find near misses among.
std::vector<std::string> namesOnOffer(const Sources& sources, const WaveformOptions& options) {
  std::vector<std::string> names = namesOf(sources);
  for (const std::string& folder : options.folders) {
    for (const NamedSource& named : listFolder(folder)) names.push_back(named.name);
  }
  return names;
}

bool isClean(const LoadedScript& loaded, const std::vector<Diagnostic>& diagnostics) {
  for (const Diagnostic& diagnostic : diagnostics) printDiagnostic(diagnostic, loaded.file);
  return diagnostics.empty();
}

void findUnused(LoadedScript& loaded, const WaveformOptions& options, const std::vector<std::string>& used) {
  for (const std::string& argument : options.given) {
    const std::string name = parseNamedSource(argument).name;
    const bool isUsed = std::ranges::any_of(
        used, [&](const std::string& other) { return ktcheckname::compareNames(name, other) == 0; });
    if (!isUsed) loaded.unusedWaveforms.push_back(name);
  }
}

std::string describeUnused(const std::string& name) {
  const bool canBeUsed = std::ranges::all_of(name, ktwfmscriptcompiler::isIdentifierCharacter);
  return "waveform \"" + name + "\" is given, and no script " +
         (canBeUsed ? "plays it" : "can: names in scripts are letters and digits alone");
}

bool isSame(const std::string& a, const std::string& b) {
  std::error_code ignored;
  return std::filesystem::equivalent(platform::toPath(a), platform::toPath(b), ignored);
}

// The file that a source names, with or without what stands behind a colon.
bool isSameFile(const std::string& output, const std::string& source) {
  return isSame(output, source) || isSame(output, source.substr(0, source.rfind(':')));
}

void refuseSource(const std::vector<std::string>& outputs, const std::string& source, const std::string& what) {
  for (const std::string& output : outputs) {
    if (isStandardOutput(output) || !isSameFile(output, source)) continue;
    throw Refusal(output + ": would be written over " + what, "Give the output another name.");
  }
}

void warnAboutWaveform(LoadedScript& loaded, const NamedWaveform& named, const GeneratorOptions& generator) {
  const auto& [name, source, waveform] = named;
  for (const std::string& note : waveform.notes) loaded.notes.push_back("waveform \"" + name + "\": " + note);
  if (waveform.clippedSamples > 0) {
    loaded.warnings.push_back("waveform \"" + name + "\": " + formatCount(waveform.clippedSamples) + " of " +
                              formatCount(waveform.samples.size()) + " samples were beyond full scale and are clipped");
  }
  if (waveform.recordedRateHz > 0 && waveform.recordedRateHz != generator.sampleRateHz) {
    loaded.warnings.push_back("waveform \"" + name + "\" was recorded at " +
                              formatQuantity(waveform.recordedRateHz, "S/s") + " and plays at " +
                              formatQuantity(generator.sampleRateHz, "S/s") +
                              "; see --sample-rate, or put \"resample\" behind the source");
  }
}

}  // namespace

std::unique_ptr<LoadedScript> loadScript(const std::string& scriptPath, const WaveformOptions& waveforms,
                                         const GeneratorOptions& generator, std::uint64_t maxSamples) {
  checkOptions(generator);
  auto loaded = std::make_unique<LoadedScript>(ScriptFile::read(scriptPath), generator);
  // Warnings first: they need the tree of the text, which is gone before the records of the scripts are made.
  CheckedText checked = checkText(loaded->file, toScriptTraits(generator), generator.sampleRateHz);
  if (checked.scripts == 0) {
    isClean(*loaded, checked.diagnostics);
    return nullptr;
  }
  loaded->scriptWarnings = std::move(checked.diagnostics);
  std::vector<Diagnostic> diagnostics;
  loaded->builder.compile(loaded->file, diagnostics);
  const std::vector<std::string> used = loaded->builder.usedWaveforms();
  const Sources sources = collectSources(waveforms, used);
  const bool isComplete = std::ranges::all_of(used, [&](const std::string& name) { return sources.contains(name); });
  if (!isComplete) {
    loaded->builder.checkWaveformsAreThere(namesOf(sources), namesOnOffer(sources, waveforms), diagnostics);
  }
  if (!isClean(*loaded, diagnostics)) return nullptr;
  findUnused(*loaded, waveforms, used);
  for (const std::string& name : used) {
    const std::string& source = sources.find(name)->second;
    loaded->waveforms.push_back(
        {name, source, loadSource(source, {generator.sampleWidthBits, generator.sampleRateHz, maxSamples})});
    warnAboutWaveform(*loaded, loaded->waveforms.back(), generator);
  }
  return loaded;
}

bool printWarnings(const LoadedScript& loaded) {
  const auto warn = [](const std::string& warning) { printError("ktorba: warning: " + toPrintable(warning) + "\n"); };
  for (const std::string& note : loaded.notes) printError("ktorba: note: " + toPrintable(note) + "\n");
  for (const Diagnostic& warning : loaded.scriptWarnings) printDiagnostic(warning, loaded.file);
  for (const std::string& name : loaded.unusedWaveforms) warn(describeUnused(name));
  for (const std::string& warning : loaded.warnings) warn(warning);
  return !loaded.scriptWarnings.empty() || !loaded.unusedWaveforms.empty() || !loaded.warnings.empty();
}

// Given waveforms need not be played to be what somebody means to keep; of a folder, those that are played are sources.
void refuseSources(const std::vector<std::string>& outputs, const std::string& scriptPath,
                   const WaveformOptions& waveforms, const LoadedScript& loaded) {
  refuseSource(outputs, scriptPath, "the script");
  for (const std::string& argument : waveforms.given) {
    const NamedSource named = parseNamedSource(argument);
    refuseSource(outputs, named.source, "the waveform \"" + named.name + "\"");
  }
  for (const NamedWaveform& named : loaded.waveforms) {
    refuseSource(outputs, named.source, "the waveform \"" + named.name + "\"");
  }
}

bool buildPrograms(LoadedScript& loaded) {
  for (const NamedWaveform& named : loaded.waveforms) {
    loaded.builder.addWaveform(named.name, named.waveform.samples.size());
  }
  std::vector<Diagnostic> diagnostics;
  loaded.programs = loaded.builder.build(diagnostics);
  return isClean(loaded, diagnostics);
}

const Program& findProgram(const LoadedScript& loaded, const std::string& name) {
  std::vector<std::string> names;
  const auto isCalled = [](const std::string& wanted) {
    return [&wanted](const std::string& other) { return ktcheckname::compareNames(wanted, other) == 0; };
  };
  for (const Program& program : loaded.programs) {
    const std::string& known = program.entry.script.name;
    if (std::ranges::none_of(names, isCalled(known))) names.push_back(known);
  }
  if (name.empty() && names.size() > 1) {
    throw Refusal(loaded.file.name() + " holds several scripts", "It holds " + join(names) + ".", Setting::kScriptName);
  }
  const std::string& wanted = name.empty() ? names.front() : name;
  const auto last = std::find_if(loaded.programs.rbegin(), loaded.programs.rend(),
                                 [&](const Program& program) { return isCalled(wanted)(program.entry.script.name); });
  if (last != loaded.programs.rend()) return *last;
  const std::string hint = tellSimilar("script", name, names);
  throw Refusal(loaded.file.name() + " holds no script \"" + name + "\"",
                hint.empty() ? "It holds " + join(names) + "." : hint);
}

}  // namespace tools::cli
