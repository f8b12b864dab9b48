#include "cli/troff.h"

namespace tools::cli {

std::string toTroff(std::string_view text) {
  std::string escaped;
  bool isLineStart = true;
  for (const char c : text) {
    if (isLineStart && (c == '.' || c == '\'')) escaped += "\\&";
    if (c == '\\') {
      escaped += "\\e";
    } else {
      escaped += c == '-' ? "\\-" : std::string(1, c);
    }
    isLineStart = c == '\n';
  }
  return escaped;
}

}  // namespace tools::cli
