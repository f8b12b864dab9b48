// What is told only with waveforms at hand, in words for those who wrote the script: instructions that compile and do
// not fit what they play, and names of waveforms that nobody gave.
#pragma once

#include <span>
#include <string>

#include "ktWfmScriptCompiler/ScriptTraits.h"
#include "kterr/Exception.h"
#include "tools/diagnostics/Diagnostic.h"
#include "tools/diagnostics/json.h"
#include "tools/syntax/SyntaxTree.h"

namespace tools {

class MisfitDescriber {
 public:
  // Reads the text once; it compiles. Borrows the file. `minFetchSamples`: what the generator plays at least at a time.
  MisfitDescriber(const ScriptFile& file, const ktwfmscriptcompiler::ScriptTraits& traits,
                  std::uint32_t minFetchSamples)
      : file_(file), tree_(file.text(), traits), minFetchSamples_(minFetchSamples) {}

  // Why no words came of the instruction, or the script, at that place.
  Diagnostic describe(Place place, const kterr::Exception& failure) const;

  // That the generate at that place plays a waveform `name` that is not there, with a near miss among those on offer.
  Diagnostic describeUnknownWaveform(Place generate, std::string_view name, std::span<const std::string> onOffer) const;

 private:
  // A number of a subset or marker, with its token.
  struct Number {
    std::uint32_t value;
    std::uint32_t token;
  };

  void describeSubset(std::uint32_t node, const ElaborationRecord& record, Diagnostic& diagnostic) const;
  void describeMarkers(std::uint32_t node, const ElaborationRecord& record, Diagnostic& diagnostic) const;
  void describeCloseMarkers(const std::vector<Number>& positions, Diagnostic& diagnostic) const;
  std::vector<Number> numbersOf(std::uint32_t instruction, NodeKind part) const;
  std::uint32_t instructionAt(Place place) const;
  void pointAt(std::uint32_t token, Diagnostic& diagnostic) const;
  Place placeOf(std::uint32_t token) const { return file_.placeOf(tree_.tokens()[token].offset()); }

  const ScriptFile& file_;
  SyntaxTree tree_;
  std::uint32_t minFetchSamples_;
};

}  // namespace tools
