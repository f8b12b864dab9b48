#include "cli/commands/report.h"

#include "cli/console.h"
#include "cli/diagnostics/Diagnostic.h"

namespace cli {

void printRow(std::string_view label, const std::string& text) {
  constexpr std::size_t kLabelColumn = 15;
  print(std::string(label) + std::string(kLabelColumn - label.size(), ' ') + toPrintable(text) + "\n");
}

}  // namespace cli
