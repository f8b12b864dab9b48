// Errors and warnings about a script, and how they are shown: as compilers do, or as JSON for editors.
#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "tools/diagnostics/ScriptFile.h"
#include "tools/diagnostics/messages.h"
#include "tools/text/Refusal.h"

namespace tools {

struct Diagnostic {
  enum class Severity { kError, kWarning };
  // Another place that has to do with it, and what it is: "the first one is here".
  struct Related {
    Place place;
    std::string message;
  };

  // A change of the text that mends it, or may.
  struct Fix {
    std::size_t offset = 0;  // of the first byte replaced
    std::size_t length = 0;  // bytes replaced; 0: the new text is put in
    std::string text;
    bool isCertain = false;
  };

  Severity severity = Severity::kError;
  Place place = {};
  std::string message;               // one sentence, without a full stop
  std::string help = {};             // what to do; may be empty
  Setting setting = Setting::kNone;  // that would mend it, too
  std::vector<Related> related = {};
  std::vector<Fix> fixes = {};
  std::string constant = {};  // the library's error constant; empty for what the tools themselves find
  std::int32_t code = 0;      // its code
  std::uint32_t length = 0;   // bytes from the place on; 0: the word there
  MessageKind kind = MessageKind::kNone;
};

inline constexpr int kUsualColumns = 171;  // 160 of them for the line itself

// Three to five lines:
//   pulses.kts:2:5: error: unknown instruction `genrate`
//       2 |     genrate pulse
//         |     ^~~~~~~
//         = A similar instruction: `generate`. Instructions are generate, wait, repeat and clear.
//         = ktwfmscriptcompiler_errors::kErrorKeywordExpectedInScript (-1074101568)
// and for each related place the first three again, as a note. The position in the first line counts bytes; the caret
// stands under the character whatever tabs and wide or combining characters are before it. Long lines are shown around
// the place, within `columns`.
std::string formatDiagnostic(const Diagnostic& diagnostic, const ScriptFile& file, int columns = kUsualColumns);

// "pulses.kts:2:5: note: message", and the line of the place as above.
std::string formatNote(const ScriptFile& file, Place place, const std::string& message, int columns = kUsualColumns);

struct FixedText {
  std::string text;
  std::size_t count = 0;  // of fixes that are in it
};

// `text` with the certain fixes of its diagnostics; of two that touch the first.
FixedText applyCertainFixes(std::string_view text, std::span<const Diagnostic> diagnostics);

const char* severityText(Diagnostic::Severity severity);  // "error", "warning"

}  // namespace tools
