// The scripts of two files against each other, and what is said of them. The files' programs and waveforms must outlive
// what is made of them. Any thread may call.
#pragma once

#include <functional>
#include <nlohmann/json_fwd.hpp>
#include <span>
#include <string>
#include <vector>

#include "tools/difference/comparePlays.h"
#include "tools/program/ProgramBuilder.h"

namespace tools {

struct ComparedFile {
  const ScriptFile& file;
  const ProgramBuilder& builder;
  std::span<const Program> programs;
  // The samples of a waveform that a program plays.
  std::function<SampleSpan(const std::string& name)> samplesOf;
};

// One script of each file; null: the file has none of that name.
struct ComparedScripts {
  const Program* first = nullptr;
  const Program* second = nullptr;
  PlayComparison plays;  // where both are there

  bool areSame() const { return first != nullptr && second != nullptr && !plays.difference; }
  const std::string& name() const { return (first != nullptr ? first : second)->entry.script.name; }
};

// Pairs scripts by name, in the order of the first file; the only scripts of two files are a pair whatever they are
// called. Where `name` is not empty only that one of each. Of several of a name the last one counts, as in a session.
// Throws Refusal when neither has a script of that name.
std::vector<ComparedScripts> compareScripts(const ComparedFile& first, const ComparedFile& second,
                                            const std::string& name);

// "marker0" and the like, and the place in the script: what one side does at the difference.
struct DifferenceNote {
  Place place;  // unknown where no script is to blame
  std::string message;
};
DifferenceNote noteOf(const PlayDifference::Doing& doing, PlayDifference::Kind kind, const Program& program);

// "schema", "same" and "scripts": objects with "name", "same", "whole" (false: the same for as far as can be counted)
// and "difference", null or an object with "kind" ("level", "markers", "triggers", "end" or "missing"), "sample" (a
// text, since it may pass 2^53; null where it passes 2^64), and "first" and "second", each null where the script is
// missing, else with "message", and "line" and "column" (bytes, from 1), null where no place is to blame.
nlohmann::ordered_json describeDifferences(std::span<const ComparedScripts> scripts);

}  // namespace tools
