#include "tools/sources/CsvLayout.h"

#include <algorithm>

#include "tools/sources/columnNames.h"
#include "tools/text/Refusal.h"

namespace tools {
namespace {

constexpr std::string_view kSeparators = "\t;, |:";  // the first four are looked for, in this order
constexpr std::size_t kMostTextRows = 1000;          // before the numbers
constexpr std::size_t kLongestShown = 40;            // bytes of a field in a message

// Whether the first field, whatever parts it from the next, looks like a number.
bool beginsWithNumber(std::string_view row) {
  const std::size_t first = row.find_first_not_of("\t ;,\"");
  if (first == std::string_view::npos) return false;
  row.remove_prefix(first);
  return looksLikeNumber(row.substr(0, row.find_first_of("\t ;,\"")));
}

bool areAllNumbers(const std::vector<std::string>& fields, char decimal) {
  return std::ranges::all_of(
      fields, [decimal](const std::string& field) { return field.empty() || parseField(field, decimal); });
}

bool isAnyNumberLike(const std::vector<std::string>& fields) {
  return std::ranges::any_of(fields, [](const std::string& field) { return looksLikeNumber(field); });
}

class LayoutFinder {
 public:
  LayoutFinder(const std::string& source, TextLines& lines, const CsvOptions& options)
      : source_(source), lines_(lines), options_(options) {
    layout_.dialect.decimal = options.decimal;
  }

  CsvLayout find() {
    findFirstRow();
    findSeparator();
    findNames();
    countColumns();
    return std::move(layout_);
  }

 private:
  [[noreturn]] void refuse(const std::string& reason, const std::string& help = {}) const {
    throw Refusal(source_ + ": " + reason, help);
  }

  std::vector<std::string> split(const CsvTextRow& row) const {
    return splitRow(source_, row, layout_.dialect.separator);
  }

  // --- What stands before the numbers.

  void findFirstRow() {
    for (std::string_view line; lines_.next(line);) {
      if (lines_.row() == 1 && takeSeparatorRow(line)) continue;
      if (lines_.row() <= std::max(options_.skip, options_.headerRow)) {
        if (lines_.row() == options_.headerRow) takeNamesRow(line);
      } else if (const std::string_view text = trimBlanks(line); !text.empty() && !isCsvComment(text)) {
        layout_.first = {std::string(line), lines_.row()};
        if (isFirstOfNumbers(text)) return;
        keepTextRow();
      }
    }
    if (options_.headerRow > lines_.row()) refuse("has no row " + std::to_string(options_.headerRow));
    if (before_.empty() || options_.headerRow > 0) refuse("holds no samples");
    refuseWithoutNumbers();
  }

  // Only the last two can hold names and units.
  void keepTextRow() {
    if (++textRows_ > kMostTextRows) refuseWithoutNumbers();
    if (before_.size() == 2) before_.erase(before_.begin());
    before_.push_back(layout_.first);
  }

  bool takeSeparatorRow(std::string_view text) {
    if (text.starts_with('"') && text.ends_with('"') && text.size() > 2) text = text.substr(1, text.size() - 2);
    const bool isSaid =
        text.size() == 5 && text.starts_with("sep=") && kSeparators.find(text.back()) != std::string::npos;
    if (!isSaid) return false;
    layout_.dialect.separator = text.back();
    isSeparatorSaid_ = true;
    return true;
  }

  // The row may be a comment that holds the names.
  void takeNamesRow(std::string_view line) {
    const std::size_t first = line.find_first_not_of("#% ");
    before_.push_back({std::string(line.substr(std::min(first, line.size()))), lines_.row()});
  }

  bool isFirstOfNumbers(std::string_view text) const {
    if (options_.hasNoHeader) return true;
    if (options_.headerRow == 0) return beginsWithNumber(text);
    const auto fields = splitRow(text, separatorOf(text));
    return before_.size() > 1 || !fields || !areUnits(*fields);
  }

  [[noreturn]] void refuseWithoutNumbers() const {
    refuse("no row begins with a number, as far as row " + std::to_string(lines_.row()),
           "Say where the numbers begin: header=ROW for the row of the names, or skip=ROWS,header=none.");
  }

  // --- How rows are cut.

  static char separatorOf(std::string_view text) {
    for (const char separator : kSeparators.substr(0, 4)) {
      if (text.find(separator) != std::string_view::npos) return separator;
    }
    return kOneColumn;
  }

  void findSeparator() {
    if (isSeparatorSaid_) return;
    std::string_view text = layout_.first.text;
    while (text.starts_with(' ')) text.remove_prefix(1);
    while (text.ends_with(' ')) text.remove_suffix(1);
    layout_.dialect.separator = separatorOf(text);
    if (layout_.dialect.separator == ',' && !isSeparatedByCommas(text)) {
      layout_.dialect.separator = text.find(' ') == std::string_view::npos ? kOneColumn : ' ';
    }
  }

  // Of a row with commas, and with neither tabs nor semicolons.
  bool isSeparatedByCommas(std::string_view text) const {
    if (options_.decimal != 0) return options_.decimal == '.' || text.find('"') != std::string_view::npos;
    const auto byCommas = splitRow(text, ',');
    if (!byCommas || !areAllNumbers(*byCommas, '.')) return !isSeparatedByBlanks(text);
    if (!parseField(text, ',')) return true;
    return !isOneColumn(text);
  }

  static bool isSeparatedByBlanks(std::string_view text) {
    const auto byBlanks = splitRow(text, ' ');
    return byBlanks && areAllNumbers(*byBlanks, ',');
  }

  // Of a row such as "0,05": the names tell, or that somebody wants its second column.
  bool isOneColumn(std::string_view text) const {
    if (!before_.empty() && !options_.hasNoHeader) return separatorOf(before_.back().text) != ',';
    if (options_.selector == "2") return false;
    refuse("row " + std::to_string(layout_.first.number) + ", " + quote(text) +
               ", is one number with a decimal comma or two columns",
           "Say which: decimal=, for one number, decimal=. for two columns.");
  }

  // --- Names and columns.

  void findNames() {
    if (options_.hasNoHeader || before_.empty()) return;
    if (before_.size() > 1) {
      const auto units = split(before_.back());
      const CsvTextRow& above = before_[before_.size() - 2];
      if (areUnits(units) && !areUnits(split(above)) && split(above).size() == units.size()) before_.pop_back();
    }
    if (options_.headerRow > 0) before_.resize(1);
    namesRow_ = before_.back().number;
    layout_.names = split(before_.back());
    if (options_.headerRow == 0 && isAnyNumberLike(layout_.names)) refuseMixedRow(before_.back());
    std::ranges::transform(layout_.names, layout_.names.begin(), toUtf8);
    before_.clear();
  }

  [[noreturn]] void refuseMixedRow(const CsvTextRow& row) const {
    const std::string number = std::to_string(row.number);
    refuse("row " + number + ", " + quote(trimBlanks(row.text)) + ", is neither names nor numbers",
           "If it names the columns, say header=" + number + "; if it is no part of the table, skip=" + number + ".");
  }

  void countColumns() {
    layout_.firstFields = split(layout_.first);
    layout_.mostFields = layout_.firstFields.size();
    layout_.columns = countWithoutEmptyEnd(layout_.firstFields);
    if (layout_.names.empty()) return;
    checkNamesCount();
    layout_.mostFields = std::max(layout_.mostFields, layout_.names.size());
    layout_.columns = std::max(layout_.columns, countWithoutEmptyEnd(layout_.names));
  }

  void checkNamesCount() const {
    const bool namesAreOfOther = layout_.dialect.separator == kOneColumn &&
                                 separatorOf(layout_.names[0]) != kOneColumn && separatorOf(layout_.names[0]) != ' ';
    const bool fits =
        countWithoutEmptyEnd(layout_.names) <= layout_.firstFields.size() && layout_.names.size() >= layout_.columns;
    if (fits && !namesAreOfOther) return;
    refuse(
        "row " + std::to_string(namesRow_) + " names " +
            (namesAreOfOther ? "several columns" : countOf(countWithoutEmptyEnd(layout_.names), "column")) +
            ", and row " + std::to_string(layout_.first.number) + " has " + countOf(layout_.columns, "field"),
        "If it does not name the columns, say so: skip=" + std::to_string(layout_.first.number - 1) + ",header=none.");
  }

  const std::string& source_;
  TextLines& lines_;
  const CsvOptions& options_;
  std::vector<CsvTextRow> before_;  // the last two rows of text in front of the numbers
  std::size_t textRows_ = 0;
  bool isSeparatorSaid_ = false;
  std::uint64_t namesRow_ = 0;
  CsvLayout layout_;
};

}  // namespace

CsvLayout findCsvLayout(const std::string& source, TextLines& lines, const CsvOptions& options) {
  return LayoutFinder(source, lines, options).find();
}

std::vector<std::string> splitRow(const std::string& source, const CsvTextRow& row, char separator) {
  if (auto fields = splitRow(row.text, separator)) return *std::move(fields);
  throw Refusal(source + ": row " + std::to_string(row.number) +
                " has a quote that ends in the middle of a field, or never");
}

bool isCsvComment(std::string_view row) { return row.front() == '#' || row.front() == '%'; }

std::string shorten(std::string_view text) {
  std::string shown = toUtf8(text);
  if (shown.size() <= kLongestShown) return shown;
  std::size_t end = kLongestShown;
  while (end > 0 && (static_cast<unsigned char>(shown[end]) & 0xC0) == 0x80) --end;
  shown.resize(end);
  return shown + "\u2026";
}

std::string quote(std::string_view text) { return "\"" + shorten(text) + "\""; }

std::string countOf(std::size_t count, const char* what) {
  return std::to_string(count) + " " + what + (count == 1 ? "" : "s");
}

}  // namespace tools
