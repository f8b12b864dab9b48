// The JSON of this room, read and written in one source.
#pragma once

#include <cstdint>
#include <memory>
#include <nlohmann/json_fwd.hpp>
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

// The array "diagnostics" of formatDiagnosticsAsJson() for one file, without "file".
nlohmann::ordered_json diagnosticsAsJson(const ScriptFile& file, std::span<const Diagnostic> diagnostics);

// Empty for null and for what is no elaboration.
ElaborationRecord readElaboration(const char* text);

// The diagnostics of one file; without a text where it could not be read.
struct FileDiagnostics {
  std::string name;
  std::shared_ptr<const ScriptFile> file;
  std::vector<Diagnostic> diagnostics;
};

// A JSON document, "schema" 1: "diagnostics" is an array of objects with
//   "file", "severity" ("error" or "warning"), "message", "help", "constant" and "code" of the library;
//   "range": "start" and "end" (behind the last byte), each with "offset" (bytes from 0), "line" and "column" (bytes)
//     from 1, and "utf16" (the column in UTF-16 code units, from 0); null for the text as a whole;
//   "related": "range" and "message" of other places that have to do with it;
//   "fixes": "range", "text" to put there and "confidence" ("certain" or "maybe").
// A line feed stands behind it. Bytes that are no UTF-8 appear as U+FFFD.
std::string formatDiagnosticsAsJson(std::span<const FileDiagnostics> files);

// `text`, made printable, as a JSON string.
std::string quoteAsJson(std::string_view text);

}  // namespace tools
