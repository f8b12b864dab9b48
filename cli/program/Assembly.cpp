#include "cli/program/Assembly.h"

#include <map>

#include "cli/UserError.h"
#include "cli/console.h"
#include "cli/nearMiss.h"
#include "cli/quantities.h"
#include "ktcheckname/compareNames.h"

namespace cli {
namespace {

using Sources = std::map<std::string, std::string, ktcheckname::NameLess>;

Sources collectSources(const WaveformOptions& options) {
  Sources sources;
  for (const std::string& argument : options.given) {
    const NamedSource named = parseNamedSource(argument);
    if (!sources.emplace(named.name, named.source).second) {
      throw UserError("waveform \"" + named.name + "\" is given twice");
    }
  }
  Sources found;
  for (const std::string& folder : options.folders) {
    for (const NamedSource& named : listFolder(folder)) {
      const auto [entry, isNew] = found.emplace(named.name, named.source);
      if (!isNew && !sources.contains(named.name)) {
        throw UserError("waveform \"" + named.name + "\" is both " + entry->second + " and " + named.source);
      }
    }
  }
  sources.merge(found);  // what was given by name stays
  return sources;
}

std::vector<std::string> namesOf(const Sources& sources) {
  std::vector<std::string> names;
  for (const auto& [name, source] : sources) names.push_back(name);
  return names;
}

bool isClean(const Assembly& assembly, const std::vector<Diagnostic>& diagnostics) {
  for (const Diagnostic& diagnostic : diagnostics) printError(formatDiagnostic(diagnostic, assembly.file));
  return diagnostics.empty();
}

void warnAboutUnused(Assembly& assembly, const WaveformOptions& options, const std::vector<std::string>& used) {
  for (const std::string& argument : options.given) {
    const std::string name = parseNamedSource(argument).name;
    bool isUsed = false;
    for (const std::string& other : used) isUsed = isUsed || ktcheckname::compareNames(name, other) == 0;
    if (!isUsed) assembly.warnings.push_back("waveform \"" + name + "\" is given, and no script plays it");
  }
}

void warnAboutWaveform(Assembly& assembly, const NamedWaveform& named, const GeneratorOptions& generator) {
  const auto& [name, source, waveform] = named;
  if (waveform.clippedSamples > 0) {
    assembly.warnings.push_back("waveform \"" + name + "\": " + formatCount(waveform.clippedSamples) + " of " +
                                formatCount(waveform.samples.size()) +
                                " samples were beyond full scale and are clipped");
  }
  if (waveform.recordedRateHz > 0 && waveform.recordedRateHz != generator.sampleRateHz) {
    assembly.warnings.push_back("waveform \"" + name + "\" was recorded at " +
                                formatQuantity(waveform.recordedRateHz, "S/s") + " and plays at " +
                                formatQuantity(generator.sampleRateHz, "S/s") + "; see --sample-rate");
  }
}

}  // namespace

std::unique_ptr<Assembly> loadAssembly(const std::string& scriptPath, const WaveformOptions& waveforms,
                                       const GeneratorOptions& generator, std::uint64_t maxSamples) {
  checkOptions(generator);
  auto assembly = std::make_unique<Assembly>(ScriptFile::read(scriptPath), generator);
  std::vector<Diagnostic> diagnostics;
  assembly->workbench.compile(assembly->file, diagnostics);
  if (!isClean(*assembly, diagnostics)) return nullptr;
  const Sources sources = collectSources(waveforms);
  assembly->workbench.checkWaveformsAreThere(namesOf(sources), diagnostics);
  if (!isClean(*assembly, diagnostics)) return nullptr;
  const std::vector<std::string> used = assembly->workbench.usedWaveforms();
  warnAboutUnused(*assembly, waveforms, used);
  for (const std::string& name : used) {
    const std::string& source = sources.find(name)->second;
    assembly->waveforms.push_back(
        {name, source, loadSource(source, {generator.sampleWidthBits, generator.sampleRateHz, maxSamples})});
    warnAboutWaveform(*assembly, assembly->waveforms.back(), generator);
  }
  return assembly;
}

void printWarnings(const Assembly& assembly) {
  for (const std::string& warning : assembly.warnings) printError("ktorba: warning: " + toPrintable(warning) + "\n");
}

bool buildPrograms(Assembly& assembly) {
  for (const NamedWaveform& named : assembly.waveforms) {
    assembly.workbench.addWaveform(named.name, named.waveform.samples.size());
  }
  std::vector<Diagnostic> diagnostics;
  assembly.programs = assembly.workbench.build(diagnostics);
  return isClean(assembly, diagnostics);
}

const Program& findProgram(const Assembly& assembly, const std::string& name) {
  std::vector<std::string> names;
  for (const Program& program : assembly.programs) {
    names.push_back(program.entry.script.name);
    if (!name.empty() && ktcheckname::compareNames(name, names.back()) == 0) return program;
  }
  if (name.empty() && assembly.programs.size() == 1) return assembly.programs.front();
  std::string list;
  for (const std::string& known : names) list += (list.empty() ? "" : ", ") + known;
  if (name.empty())
    throw UserError(assembly.file.name() + " holds several scripts", "Choose one with --script: " + list);
  const std::string nearMiss = findNearMiss(name, names);
  throw UserError(assembly.file.name() + " holds no script \"" + name + "\"",
                  nearMiss.empty() ? "It holds " + list + "." : "Did you mean \"" + nearMiss + "\"?");
}

}  // namespace cli
