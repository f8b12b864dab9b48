#include "cli/program/Workbench.h"

#include <algorithm>
#include <set>

#include "cli/UserError.h"
#include "cli/characters.h"
#include "cli/diagnostics/elaboration.h"
#include "cli/nearMiss.h"
#include "cli/program/faultyScripts.h"
#include "cli/quantities.h"
#include "ktcheckname/checkName.h"
#include "kterr/Exception.h"

namespace cli {
namespace {

using ktorba::CompiledScript;
using ktorba::FetchRecord;
using ktorba::InstructionOrigin;
using ktwfmscriptcompiler::SourcePosition;
using Part = ktorba::InstructionOrigin::Part;

constexpr std::string_view kWordEnds = " \t(),/";

// Calls `use` with the indices of every generate of the scripts and its record, in text order.
template <typename Use>
void forEachGenerate(const std::vector<CompiledScript>& scripts, Use use) {
  for (std::size_t script = 0; script < scripts.size(); ++script) {
    for (std::size_t block = 0; block < scripts[script].blocks.size(); ++block) {
      const auto& fetches = scripts[script].blocks[block].fetches;
      for (std::size_t fetch = 0; fetch < fetches.size(); ++fetch) {
        if (!fetches[fetch].isWait) use(script, block, fetch, fetches[fetch]);
      }
    }
  }
}

}  // namespace

const FetchRecord* Program::fetchOf(std::size_t address) const {
  const InstructionOrigin& origin = origins[address];
  return origin.part == Part::kFetch ? &entry.script.blocks[origin.block].fetches[origin.fetch] : nullptr;
}

Workbench::Workbench(const GeneratorOptions& options)
    : options_(options),
      traits_(toHWTraits(options)),
      scriptTraits_(toScriptTraits(options)),
      processor_(scriptTraits_, &encoder_, options.minFetchSamples),
      memory_(options.memorySizeBytes, options.memoryWordBytes) {
  encoder_.receiveHWTraits(traits_);
}

std::size_t Workbench::compile(const ScriptFile& file, std::vector<Diagnostic>& diagnostics) {
  file_ = &file;
  if (const auto invalid = findInvalidUtf8(file.text())) {
    const ScriptFile::Place place = file.placeOf(*invalid);
    Diagnostic diagnostic = diagnoseFailure(ktorba_codes::kTextNotConvertible.code, nullptr);
    diagnostic.line = place.line;
    diagnostic.position = place.position;
    diagnostic.message = "The text is not valid UTF-8";
    diagnostics.push_back(diagnostic);
    return 0;
  }
  try {
    processor_.compileScripts(file.text(), scripts_, &map_);
    return scripts_.size();
  } catch (const kterr::Exception&) {
    findScriptErrors(file, scriptTraits_, diagnostics);
    return 0;
  }
}

std::vector<std::string> Workbench::usedWaveforms() const {
  std::vector<std::string> names;
  std::set<std::string, ktcheckname::NameLess> known;
  forEachGenerate(scripts_, [&](std::size_t, std::size_t, std::size_t, const FetchRecord& fetch) {
    if (known.emplace(fetch.waveformName).second) names.emplace_back(fetch.waveformName);
  });
  return names;
}

void Workbench::checkWaveformsAreThere(const std::vector<std::string>& given,
                                       std::vector<Diagnostic>& diagnostics) const {
  const std::set<std::string, ktcheckname::NameLess> known(given.begin(), given.end());
  std::set<std::string, ktcheckname::NameLess> missing;
  forEachGenerate(scripts_, [&](std::size_t script, std::size_t block, std::size_t fetch, const FetchRecord& record) {
    const std::string name(record.waveformName);
    if (known.contains(name) || diagnostics.size() >= kMaxErrors || !missing.insert(name).second) return;
    const SourcePosition place = placeOfName(map_[script].blocks[block].fetches[fetch].start);
    const kterr::ErrorConstant& constant = ktorba_errors::kErrorSpecifiedWaveformNotFound;
    const std::string nearMiss = findNearMiss(name, given);
    Diagnostic diagnostic;
    diagnostic.line = place.line;
    diagnostic.position = place.positionInLine;
    diagnostic.message = "Nobody gave the waveform \"" + name + "\"";
    diagnostic.help =
        nearMiss.empty() ? "Give it with --waveform " + name + "=SOURCE." : "Did you mean \"" + nearMiss + "\"?";
    diagnostic.constant = constant.text;
    diagnostic.code = constant.code;
    diagnostics.push_back(diagnostic);
  });
}

SourcePosition Workbench::placeOfName(SourcePosition generate) const {
  const std::string_view line = file_->line(generate.line);
  const std::size_t keywordEnd = line.find_first_of(kWordEnds, generate.positionInLine - 1);
  if (keywordEnd == std::string_view::npos) return generate;
  const std::size_t name = line.find_first_not_of(" \t", keywordEnd);
  if (name == std::string_view::npos || kWordEnds.find(line[name]) != std::string_view::npos) return generate;
  return {generate.line, static_cast<std::uint32_t>(name + 1)};
}

void Workbench::checkNewWaveform(const std::string& name, std::uint64_t sampleCount) const {
  kterr::OwnedStatus status;
  ktcheckname::checkName(name.c_str(), status);
  if (status.code < 0) {
    const Diagnostic failure = diagnoseFailure(status.code, status.json);
    throw UserError("waveform \"" + name + "\": " + failure.message, failure.help);
  }
  if (waveforms_.containsWaveform(name)) throw UserError("waveform \"" + name + "\" is given twice");
  if (sampleCount < options_.minFetchSamples) {
    throw UserError("waveform \"" + name + "\": " + formatCount(sampleCount) + " samples are too few",
                    "The generator plays at least " + std::to_string(options_.minFetchSamples) +
                        " samples at a time; the option is --min-fetch.");
  }
}

const ktorba::WaveformEntry& Workbench::addWaveform(const std::string& name, std::uint64_t sampleCount) {
  checkNewWaveform(name, sampleCount);
  const std::uint64_t wordBytes = options_.memoryWordBytes;
  const std::uint64_t bytes = (sampleCount * options_.bytesPerSample() + wordBytes - 1) / wordBytes * wordBytes;
  if (bytes > largestFreeBytes()) {
    throw UserError("waveform \"" + name + "\" does not fit: it takes " + formatCount(bytes) +
                        " bytes, and the largest block of sample memory left has " + formatCount(largestFreeBytes()),
                    "Shorten waveforms, or give the simulated generator more memory with --memory.");
  }
  ktorba::WaveformEntry& waveform = waveforms_.addWaveform(name, static_cast<std::uint32_t>(sampleCount));
  waveform.memoryOffset = memory_.allocateBlock(static_cast<std::uint32_t>(bytes));
  usedBytes_ += bytes;
  return waveform;
}

void Workbench::addUnplacedWaveform(const std::string& name, std::uint64_t sampleCount) {
  waveforms_.addWaveform(name, static_cast<std::uint32_t>(sampleCount));
}

std::vector<Program> Workbench::build(std::vector<Diagnostic>& diagnostics) {
  std::vector<Program> programs;
  for (std::size_t script = 0; script < scripts_.size() && diagnostics.size() < kMaxErrors; ++script) {
    try {
      programs.push_back(buildScript(script));
    } catch (const kterr::Exception& error) {
      Diagnostic diagnostic = diagnoseFailure(error.code(), error.getJson());
      const SourcePosition place = findCulprit(script);
      diagnostic.line = place.line;
      diagnostic.position = place.positionInLine;
      diagnostics.push_back(diagnostic);
    }
  }
  return programs;
}

Program Workbench::buildScript(std::size_t script) {
  Program program;
  processor_.buildInstructionWords(scripts_[script], waveforms_, program.entry, &program.origins);
  program.entry.script = scripts_[script];
  program.places = placesOf(script, program.origins);
  return program;
}

std::vector<SourcePosition> Workbench::placesOf(std::size_t script,
                                                const std::vector<InstructionOrigin>& origins) const {
  std::vector<SourcePosition> places;
  for (const InstructionOrigin& origin : origins) {
    switch (origin.part) {
      case Part::kFetch:
        places.push_back(map_[script].blocks[origin.block].fetches[origin.fetch].start);
        break;
      case Part::kLoopStart:
      case Part::kLoopEnd:
        places.push_back(map_[script].blocks[origin.block].block.start);
        break;
      default:
        places.push_back(map_[script].script.start);
        break;
    }
  }
  return places;
}

// Fetches are checked one by one and stand for themselves, so the first that does not build alone is to blame.
SourcePosition Workbench::findCulprit(std::size_t script) {
  const CompiledScript& whole = scripts_[script];
  for (std::size_t block = 0; block < whole.blocks.size(); ++block) {
    for (std::size_t fetch = 0; fetch < whole.blocks[block].fetches.size(); ++fetch) {
      CompiledScript alone;
      alone.blocks.resize(1);
      alone.blocks[0].fetches = whole.blocks[block].fetches.subspan(fetch, 1);
      try {
        ktorba::ScriptEntry discarded;
        processor_.buildInstructionWords(alone, waveforms_, discarded);
      } catch (const kterr::Exception&) {
        return map_[script].blocks[block].fetches[fetch].start;
      }
    }
  }
  return map_[script].script.start;
}

}  // namespace cli
