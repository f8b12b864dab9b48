// Everything that is wrong with a script text, or surely not meant: what the compiler says first, and behind it what it
// would say next.
#pragma once

#include <vector>

#include "ktWfmScriptCompiler/ScriptTraits.h"
#include "ktWfmScriptCompiler/SourcePosition.h"
#include "tools/diagnostics/Diagnostic.h"

namespace tools {

// More errors of a text, or warnings, are not worth reading.
inline constexpr std::size_t kMaxErrors = 20;
inline constexpr std::size_t kMaxWarnings = 100;

constexpr Place toPlace(ktwfmscriptcompiler::SourcePosition position) {
  return {position.line, position.positionInLine};
}

// What a text holds: scripts, or errors; and warnings where it has no errors.
struct CheckedText {
  std::size_t scripts = 0;  // 0: it has errors
  std::vector<Diagnostic> diagnostics;
};

// Checks a text, encoding first. It is read once; nothing that scripts become is kept.
CheckedText checkText(const ScriptFile& file, const ktwfmscriptcompiler::ScriptTraits& traits, double sampleRateHz);

// The errors of a text that the compiler refuses, in the order of the text, at most kMaxErrors; none of one that it
// accepts. Of each script the first is the compiler's own, with its code; behind it come those that do not follow from
// others. `sampleRateHz` is what times are explained with.
std::vector<Diagnostic> findErrors(const ScriptFile& file, const ktwfmscriptcompiler::ScriptTraits& traits,
                                   double sampleRateHz);

// That a text is no UTF-8, with the place of the first byte that is not; nothing when it is.
std::vector<Diagnostic> checkEncoding(const ScriptFile& file);

}  // namespace tools
