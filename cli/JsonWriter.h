// The JSON object that a command prints.
#pragma once

#include "tools/diagnostics/JsonWriter.h"

namespace tools::cli {

class JsonWriter : public tools::JsonWriter {
 public:
  // Begins with the members "schema" and "command".
  explicit JsonWriter(std::string_view command);
};

}  // namespace tools::cli
