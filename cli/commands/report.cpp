#include "cli/commands/report.h"

#include "cli/console.h"
#include "tools/diagnostics/Diagnostic.h"
#include "tools/text/characters.h"

namespace tools::cli {

void printRow(std::string_view label, const std::string& text) {
  print(std::string(label) + std::string(static_cast<std::size_t>(kLabelColumn) - label.size(), ' ') +
        toPrintable(text) + "\n");
}

}  // namespace tools::cli
