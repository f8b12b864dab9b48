// How a table in text is laid out: which row holds its names, where its numbers begin, and what parts them.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "tools/sources/CsvRow.h"
#include "tools/sources/TextLines.h"

namespace tools {

// What somebody said of the table.
struct CsvOptions {
  std::string selector;  // of a column; empty: none
  std::uint64_t skip = 0;
  std::uint64_t headerRow = 0;  // 0: not said
  bool hasNoHeader = false;
  char decimal = 0;
};

struct CsvTextRow {
  std::string text;
  std::uint64_t number = 0;
};

struct CsvLayout {
  CsvDialect dialect;
  std::vector<std::string> names;  // none: the columns have no names
  CsvTextRow first;                // of numbers
  std::vector<std::string> firstFields;
  std::size_t columns = 0;
  std::size_t mostFields = 0;  // with empty ones at the end
};

// Reads `lines` as far as the first row of numbers. Throws Refusal for what can be meant in two ways, and for a table
// without numbers.
CsvLayout findCsvLayout(const std::string& source, TextLines& lines, const CsvOptions& options);

// As splitRow(), but throws Refusal.
std::vector<std::string> splitRow(const std::string& source, const CsvTextRow& row, char separator);

// Whether a row that is not blank is a comment.
bool isCsvComment(std::string_view row);

// What a message shows of a text from the file: UTF-8, cut where it is long; in quotes.
std::string shorten(std::string_view text);
std::string quote(std::string_view text);

// "1 column", "3 columns".
std::string countOf(std::size_t count, const char* what);

}  // namespace tools
