// Cuts a text into its scripts without compiling it, so that a tool can go on behind a faulty one.
#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "ktWfmScriptCompiler/SourcePosition.h"

namespace ktwfmscriptcompiler {

struct ScriptText {
  std::string_view text;  // up to and including "end script"; borrowed from the text that was split
  SourcePosition start;   // of its first byte in the whole text

  // The place in the whole text of a place in this script's own text.
  SourcePosition toWholeText(SourcePosition place) const {
    if (place.line == 1) return {start.line, start.positionInLine + place.positionInLine - 1};
    return {start.line + place.line - 1, place.positionInLine};
  }
};

// Cuts behind every "end" that is followed by "script", comments aside: in a text without faults those are the ends
// of its scripts. What is left behind the last one comes last, unless it is blank. Never fails, whatever the text.
std::vector<ScriptText> splitScripts(const std::string& text);

}  // namespace ktwfmscriptcompiler
