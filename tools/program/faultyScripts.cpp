#include "tools/program/faultyScripts.h"

#include <algorithm>
#include <optional>

#include "ktWfmScriptCompiler/Lexer.h"
#include "ktWfmScriptCompiler/compile.h"
#include "ktWfmScriptCompiler/splitScripts.h"
#include "ktcheckname/compareNames.h"
#include "kterr/Exception.h"
#include "tools/diagnostics/elaboration.h"

namespace tools {
namespace {

using ktwfmscriptcompiler::ScriptText;
using ktwfmscriptcompiler::ScriptTraits;
using ktwfmscriptcompiler::SourcePosition;

constexpr std::string_view kWordEnds = " \t\r\n(),/";

std::optional<Diagnostic> compileError(const std::string& text, const ScriptTraits& traits) {
  try {
    ktwfmscriptcompiler::compile(text, traits);
    return std::nullopt;
  } catch (const kterr::Exception& error) {
    return diagnoseFailure(error.code(), error.getJson());
  }
}

bool beginsAScript(const std::string& text, const ScriptTraits& traits) {
  try {
    ktwfmscriptcompiler::Lexer lexer(traits);
    lexer.setScript(text);
    return lexer.getNextToken().type == ktwfmscriptcompiler::TokenType::kScript;
  } catch (const kterr::Exception&) {
    return false;
  }
}

std::size_t offsetOf(std::string_view text, SourcePosition place) {
  std::size_t lineStart = 0;
  for (std::uint32_t line = 1; line < place.line; ++line) lineStart = text.find('\n', lineStart) + 1;
  return std::min(text.size(), lineStart + place.positionInLine - 1);
}

bool isWord(std::string_view word, std::string_view keyword) { return ktcheckname::compareNames(word, keyword) == 0; }

// The offset of the first "script" at or behind `least` that begins a script: it neither ends one, nor is the name of
// a script or a waveform, nor stands in a comment. The text's size when there is none. Reads from the text's start,
// since the words before decide.
std::size_t findNextScript(std::string_view text, std::size_t least) {
  std::string_view previous;
  bool isName = false;  // the next word is that of a script or a waveform
  std::size_t offset = 0;
  while (offset < text.size()) {
    if (text.substr(offset, 2) == "//") {
      offset = std::min(text.find('\n', offset), text.size());
    } else if (kWordEnds.find(text[offset]) != std::string_view::npos) {
      ++offset;
    } else {
      const std::string_view word =
          text.substr(offset, std::min(text.find_first_of(kWordEnds, offset), text.size()) - offset);
      const bool isBeginning = !isName && isWord(word, "script") && !isWord(previous, "end");
      if (isBeginning && offset >= least) return offset;
      isName = isBeginning || (!isName && isWord(word, "generate"));
      previous = word;
      offset += word.size();
    }
  }
  return text.size();
}

// What of a script's text is left from `offset` on.
ScriptText restOf(const ScriptText& script, std::size_t offset) {
  const std::string_view before = script.text.substr(0, offset);
  const auto lines = static_cast<std::uint32_t>(std::count(before.begin(), before.end(), '\n'));
  const std::size_t lineStart = lines == 0 ? 0 : before.rfind('\n') + 1;
  const SourcePosition place = {lines + 1, static_cast<std::uint32_t>(offset - lineStart + 1)};
  return {script.text.substr(offset), script.toWholeText(place)};
}

// The errors of one piece of the text, which holds several scripts when an "end script" is missing.
void findErrors(ScriptText script, const ScriptTraits& traits, std::vector<Diagnostic>& diagnostics) {
  while (!script.text.empty() && diagnostics.size() < kMaxErrors) {
    auto error = compileError(std::string(script.text), traits);
    if (!error) return;
    const SourcePosition place = {std::max(1u, error->place.line), std::max(1u, error->place.position)};
    const std::size_t own = findNextScript(script.text, 0);  // the one that the error belongs to
    const std::size_t next = findNextScript(script.text, std::max(own + 1, offsetOf(script.text, place)));
    error->place = toPlace(script.toWholeText(place));
    diagnostics.push_back(std::move(*error));
    script = restOf(script, next);
  }
}

}  // namespace

void findScriptErrors(const ScriptFile& file, const ScriptTraits& traits, std::vector<Diagnostic>& diagnostics) {
  const std::size_t before = diagnostics.size();
  bool isFirst = true;
  for (const ScriptText& script : ktwfmscriptcompiler::splitScripts(file.text())) {
    // Behind a whole script the compiler reads on only where another one begins.
    if (!isFirst && !beginsAScript(std::string(script.text), traits)) break;
    isFirst = false;
    findErrors(script, traits, diagnostics);
    if (diagnostics.size() >= kMaxErrors) return;
  }
  if (diagnostics.size() > before) return;
  // What is wrong lies between the scripts, or there are none.
  auto error = compileError(file.text(), traits);
  if (error) diagnostics.push_back(std::move(*error));
}

}  // namespace tools
