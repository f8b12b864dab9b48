#include "cli/JsonWriter.h"

#include "cli/console.h"

namespace tools::cli {

JsonWriter::JsonWriter(std::string_view command)
    : tools::JsonWriter([](std::string_view text) { print(std::string(text)); }) {
  add("command", command);
}

}  // namespace tools::cli
