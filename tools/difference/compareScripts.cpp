#include "tools/difference/compareScripts.h"

#include <algorithm>
#include <nlohmann/json.hpp>

#include "ktcheckname/compareNames.h"
#include "tools/text/Refusal.h"
#include "tools/text/nearMiss.h"
#include "tools/text/words.h"

namespace tools {
namespace {

using nlohmann::ordered_json;
using Doing = PlayDifference::Doing;
using Kind = PlayDifference::Kind;

bool isCalled(const Program& program, const std::string& name) {
  return ktcheckname::compareNames(program.entry.script.name, name) == 0;
}

const Program* findLast(std::span<const Program> programs, const std::string& name) {
  const auto found =
      std::find_if(programs.rbegin(), programs.rend(), [&](const Program& program) { return isCalled(program, name); });
  return found == programs.rend() ? nullptr : &*found;
}

// Each name once.
std::vector<std::string> namesOf(std::span<const Program> programs) {
  std::vector<std::string> names;
  for (const Program& program : programs) {
    const auto isKnown = [&](const std::string& name) { return isCalled(program, name); };
    if (std::ranges::none_of(names, isKnown)) names.push_back(program.entry.script.name);
  }
  return names;
}

std::vector<ComparedScripts> pairUp(const ComparedFile& first, const ComparedFile& second, const std::string& name) {
  if (!name.empty()) return {{findLast(first.programs, name), findLast(second.programs, name), {}}};
  const std::vector<std::string> firstNames = namesOf(first.programs);
  const std::vector<std::string> secondNames = namesOf(second.programs);
  if (firstNames.size() == 1 && secondNames.size() == 1) return {{&first.programs.back(), &second.programs.back(), {}}};
  std::vector<ComparedScripts> pairs;
  pairs.reserve(firstNames.size() + secondNames.size());
  for (const std::string& known : firstNames) {
    pairs.push_back({findLast(first.programs, known), findLast(second.programs, known), {}});
  }
  for (const std::string& known : secondNames) {
    if (findLast(first.programs, known) == nullptr) pairs.push_back({nullptr, findLast(second.programs, known), {}});
  }
  return pairs;
}

TimelineWaveforms waveformsOf(const StraightPlay& play, const ComparedFile& side) {
  TimelineWaveforms waveforms;
  for (const std::string& name : play.waveforms()) waveforms.push_back(side.samplesOf(name));
  return waveforms;
}

PlayComparison compare(const ComparedScripts& scripts, const ComparedFile& first, const ComparedFile& second) {
  const StraightPlay firstPlay(*scripts.first, first.builder);
  const StraightPlay secondPlay(*scripts.second, second.builder);
  const TimelineWaveforms firstWaveforms = waveformsOf(firstPlay, first);
  const TimelineWaveforms secondWaveforms = waveformsOf(secondPlay, second);
  return comparePlays({firstPlay, firstWaveforms}, {secondPlay, secondWaveforms});
}

[[noreturn]] void refuseName(const ComparedFile& first, const ComparedFile& second, const std::string& name) {
  std::vector<std::string> names = namesOf(first.programs);
  for (const std::string& known : namesOf(second.programs)) names.push_back(known);
  const std::string hint = tellSimilar("script", name, names);
  throw Refusal("neither file holds a script \"" + name + "\"", hint.empty() ? "They hold " + join(names) + "." : hint);
}

const char* textOf(Kind kind) {
  switch (kind) {
    case Kind::kLevel:
      return "level";
    case Kind::kMarkers:
      return "markers";
    case Kind::kTriggers:
      return "triggers";
    case Kind::kEnd:
      break;
  }
  return "end";
}

ordered_json describeSide(const Program* program, const PlayDifference* difference, const Doing* doing) {
  if (program == nullptr) return nullptr;
  if (difference == nullptr) return {{"message", "is there"}, {"line", nullptr}, {"column", nullptr}};
  const DifferenceNote note = noteOf(*doing, difference->kind, *program);
  ordered_json side = {{"message", note.message}, {"line", nullptr}, {"column", nullptr}};
  if (note.place.isKnown()) {
    side["line"] = note.place.line;
    side["column"] = note.place.position;
  }
  return side;
}

ordered_json describeDifference(const ComparedScripts& scripts) {
  if (scripts.areSame()) return nullptr;
  const PlayDifference* difference = scripts.plays.difference ? &*scripts.plays.difference : nullptr;
  ordered_json described = {{"kind", difference == nullptr ? "missing" : textOf(difference->kind)},
                            {"sample", nullptr}};
  if (difference != nullptr && difference->sample != kBeyond) described["sample"] = std::to_string(difference->sample);
  described["first"] = describeSide(scripts.first, difference, difference == nullptr ? nullptr : &difference->first);
  described["second"] = describeSide(scripts.second, difference, difference == nullptr ? nullptr : &difference->second);
  return described;
}

}  // namespace

std::vector<ComparedScripts> compareScripts(const ComparedFile& first, const ComparedFile& second,
                                            const std::string& name) {
  std::vector<ComparedScripts> pairs = pairUp(first, second, name);
  for (ComparedScripts& pair : pairs) {
    if (pair.first == nullptr && pair.second == nullptr) refuseName(first, second, name);
    if (pair.first != nullptr && pair.second != nullptr) pair.plays = compare(pair, first, second);
  }
  return pairs;
}

DifferenceNote noteOf(const Doing& doing, Kind kind, const Program& program) {
  using Part = ktorba::InstructionOrigin::Part;
  const Part part = program.origins[doing.address].part;
  const char* const where = part == Part::kScriptStart                  ? ", as the script starts"
                            : part == Part::kScriptEnd && !doing.isOver ? ", held as the script ends"
                                                                        : "";
  return {program.places[doing.address], describe(doing, kind) + where};
}

ordered_json describeDifferences(std::span<const ComparedScripts> scripts) {
  auto described = ordered_json::array();
  for (const ComparedScripts& pair : scripts) {
    described.push_back({{"name", pair.name()},
                         {"same", pair.areSame()},
                         {"whole", pair.plays.isWhole},
                         {"difference", describeDifference(pair)}});
  }
  return {{"schema", 1},
          {"same", std::ranges::all_of(scripts, &ComparedScripts::areSame)},
          {"scripts", std::move(described)}};
}

}  // namespace tools
