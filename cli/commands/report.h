// The rows of a report on standard output.
#pragma once

#include <string>
#include <string_view>

namespace tools::cli {

inline constexpr int kLabelColumn = 15;  // wide

// Prints a label of at most 14 bytes in a column of its own, and the text, made printable.
void printRow(std::string_view label, const std::string& text);

}  // namespace tools::cli
