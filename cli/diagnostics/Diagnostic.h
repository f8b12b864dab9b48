// Errors and warnings about a script, and how they are shown: as compilers do, or as JSON for editors.
#pragma once

#include <cstdint>
#include <span>
#include <string>

#include "cli/diagnostics/ScriptFile.h"

namespace cli {

struct Diagnostic {
  enum class Severity { kError, kWarning };

  Severity severity = Severity::kError;
  std::uint32_t line = 0;      // from 1; 0: the text as a whole
  std::uint32_t position = 0;  // in the line, bytes from 1, as the library counts
  std::string message;         // one sentence, without a full stop
  std::string help;            // what to do; may be empty
  std::string constant;        // the library's error constant; empty for what the tool itself finds
  std::int32_t code = 0;       // its code
};

// Three to five lines:
//   pulses.kts:2:5: error: A keyword ... is missing ...: found "genrate", expected generate, wait, repeat, clear
//       2 |     genrate pulse
//         |     ^~~~~~~
//         = did you mean "generate"? Put one of ...
//         = ktwfmscriptcompiler_errors::kErrorKeywordExpectedInScript (-1074101568)
// The position in the first line counts bytes; the caret stands under the character whatever tabs and wide or
// combining characters are before it. Long lines are shown around the place.
std::string formatDiagnostic(const Diagnostic& diagnostic, const ScriptFile& file);

// A JSON array of objects with "file", "line", "column", "severity", "message", "help", "constant" and "code", a line
// feed behind it. `files` names the file of each diagnostic.
std::string formatDiagnosticsAsJson(std::span<const Diagnostic> diagnostics, std::span<const std::string> files);

// `text` as a terminal may be given it: valid UTF-8, control characters other than tabs replaced.
std::string toPrintable(std::string_view text);

}  // namespace cli
