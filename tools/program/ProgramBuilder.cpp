#include "tools/program/ProgramBuilder.h"

#include <algorithm>
#include <set>

#include "kterr/Exception.h"
#include "tools/check/checkText.h"
#include "tools/check/describeMisfit.h"
#include "tools/diagnostics/elaboration.h"
#include "tools/text/Refusal.h"
#include "tools/text/characters.h"
#include "tools/text/quantities.h"

namespace tools {
namespace {

using ktorba::CompiledScript;
using ktorba::FetchRecord;
using ktorba::InstructionOrigin;
using Part = ktorba::InstructionOrigin::Part;

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

// A length that the library cannot count is too long for every memory, as the greatest one that it can count is.
std::uint32_t toLength(std::uint64_t sampleCount) {
  return static_cast<std::uint32_t>(std::min<std::uint64_t>(sampleCount, UINT32_MAX));
}

}  // namespace

const FetchRecord* Program::fetchOf(std::size_t address) const {
  const InstructionOrigin& origin = origins[address];
  return origin.part == Part::kFetch ? &entry.script.blocks[origin.block].fetches[origin.fetch] : nullptr;
}

ProgramBuilder::ProgramBuilder(const GeneratorOptions& options)
    : sampleRateHz_(options.sampleRateHz),
      traits_(toHWTraits(options)),
      scriptTraits_(toScriptTraits(options)),
      processor_(scriptTraits_, &encoder_, options.minFetchSamples),
      memory_(options.memorySizeBytes, options.memoryWordBytes) {
  encoder_.receiveHWTraits(traits_);
}

std::size_t ProgramBuilder::compile(const ScriptFile& file, std::vector<Diagnostic>& diagnostics) {
  file_ = &file;
  diagnostics = checkEncoding(file);
  if (!diagnostics.empty()) return 0;
  try {
    processor_.compileScripts(file.text(), scripts_, &map_);
    return scripts_.size();
  } catch (const kterr::Exception&) {
    diagnostics = findErrors(file, scriptTraits_, sampleRateHz_);
    return 0;
  }
}

std::vector<std::string> ProgramBuilder::usedWaveforms() const {
  std::vector<std::string> names;
  std::set<std::string, ktcheckname::NameLess> known;
  forEachGenerate(scripts_, [&](std::size_t, std::size_t, std::size_t, const FetchRecord& fetch) {
    if (known.emplace(fetch.waveformName).second) names.emplace_back(fetch.waveformName);
  });
  return names;
}

void ProgramBuilder::checkWaveformsAreThere(const std::vector<std::string>& given,
                                            const std::vector<std::string>& onOffer,
                                            std::vector<Diagnostic>& diagnostics) const {
  const std::set<std::string, ktcheckname::NameLess> known(given.begin(), given.end());
  std::set<std::string, ktcheckname::NameLess> missing;
  std::vector<std::pair<Place, std::string>> found;
  forEachGenerate(scripts_, [&](std::size_t script, std::size_t block, std::size_t fetch, const FetchRecord& record) {
    const std::string name(record.waveformName);
    if (known.contains(name) || found.size() >= kMaxErrors || !missing.insert(name).second) return;
    found.emplace_back(toPlace(map_[script].blocks[block].fetches[fetch].start), name);
  });
  if (found.empty()) return;
  const MisfitDescriber describer(*file_, scriptTraits_, traits_.minFetchSamples);
  for (const auto& [place, name] : found) {
    diagnostics.push_back(describer.describeUnknownWaveform(place, name, onOffer));
  }
}

const ktorba::WaveformEntry& ProgramBuilder::addWaveform(const std::string& name, std::uint64_t sampleCount) {
  try {
    const ktorba::WaveformEntry& waveform = store_.allocate(name, toLength(sampleCount));
    usedBytes_ += store_.blockBytes(waveform.allocatedLength);
    return waveform;
  } catch (const kterr::Exception& error) {
    throw refusalOf(name, sampleCount, error);
  }
}

Refusal ProgramBuilder::refusalOf(const std::string& name, std::uint64_t sampleCount,
                                  const kterr::Exception& error) const {
  const std::string waveform = "waveform \"" + name + "\"";
  if (error.code() == ktorba_errors::kErrorRequestedWaveformLengthIsTooSmall.code) {
    return Refusal(waveform + ": " + formatCount(sampleCount) + " samples are too few",
                   "The generator plays at least " + std::to_string(traits_.minFetchSamples) + " samples at a time.",
                   Setting::kMinFetch);
  }
  if (error.code() == ktorba_errors::kErrorTotalWaveformSizeExceedAllocatedSizeInFPGA.code) {
    return Refusal(waveform + " does not fit: it takes " + formatCount(store_.blockBytes(toLength(sampleCount))) +
                       " bytes, and the largest block of sample memory left has " + formatCount(largestFreeBytes()),
                   "Shorten waveforms, or give the generator more memory.", Setting::kMemory);
  }
  const Diagnostic failure = diagnoseFailure(error.code(), error.getJson());
  return Refusal(waveform + ": " + failure.message, failure.help);
}

void ProgramBuilder::addUnplacedWaveform(const std::string& name, std::uint64_t sampleCount) {
  waveforms_.addWaveform(name, toLength(sampleCount));
}

std::vector<Program> ProgramBuilder::build(std::vector<Diagnostic>& diagnostics) {
  std::vector<Program> programs;
  for (std::size_t script = 0; script < scripts_.size() && diagnostics.size() < kMaxErrors; ++script) {
    try {
      programs.push_back(buildScript(script));
    } catch (const kterr::Exception& error) {
      const MisfitDescriber describer(*file_, scriptTraits_, traits_.minFetchSamples);
      diagnostics.push_back(describer.describe(findCulprit(script), error));
    }
  }
  return programs;
}

Program ProgramBuilder::buildScript(std::size_t script) {
  Program program;
  processor_.buildInstructionWords(scripts_[script], waveforms_, program.entry, &program.origins);
  program.entry.script = scripts_[script];
  program.places = placesOf(script, program.origins);
  return program;
}

std::vector<Place> ProgramBuilder::placesOf(std::size_t script, const std::vector<InstructionOrigin>& origins) const {
  std::vector<Place> places;
  for (const InstructionOrigin& origin : origins) {
    switch (origin.part) {
      case Part::kFetch:
        places.push_back(toPlace(map_[script].blocks[origin.block].fetches[origin.fetch].start));
        break;
      case Part::kLoopStart:
      case Part::kLoopEnd:
        places.push_back(toPlace(map_[script].blocks[origin.block].block.start));
        break;
      default:
        places.push_back(toPlace(map_[script].script.start));
        break;
    }
  }
  return places;
}

// Fetches are checked one by one and stand for themselves, so the first that does not build alone is to blame.
Place ProgramBuilder::findCulprit(std::size_t script) {
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
        return toPlace(map_[script].blocks[block].fetches[fetch].start);
      }
    }
  }
  return toPlace(map_[script].script.start);
}

}  // namespace tools
