// The JSON of this room, read and written in one source.
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "tools/diagnostics/Diagnostic.h"

namespace tools {

// What an elaboration of the library says.
struct ElaborationRecord {
  struct Value {
    std::string tag;
    std::string text;                    // a text as it is, anything else as JSON
    std::optional<std::int64_t> number;  // of integers
  };

  std::string constant;               // the text of the error constant; may be empty
  std::vector<std::string> messages;  // for people
  std::vector<Value> values;          // of the failing request, in order
};

// Empty for null and for what is no elaboration.
ElaborationRecord readElaboration(const char* text);

// A JSON array of objects with "file", "line", "column", "severity", "message", "help", "related" (an array of
// "line", "column" and "message"), "constant" and "code", a line feed behind it. `files` names the file of each
// diagnostic.
std::string formatDiagnosticsAsJson(std::span<const Diagnostic> diagnostics, std::span<const std::string> files);

}  // namespace tools
