#include "tools/sources/CsvFile.h"

#include <algorithm>
#include <cmath>

#include "tools/sources/CsvRow.h"
#include "tools/sources/SampleScaler.h"
#include "tools/sources/TextLines.h"
#include "tools/sources/columnNames.h"
#include "tools/text/Refusal.h"
#include "tools/text/nearMiss.h"
#include "tools/text/words.h"

namespace tools {
namespace {

constexpr std::string_view kSeparators = "\t;, |:";  // the first four are looked for, in this order
constexpr std::size_t kMostTextRows = 1000;          // before the numbers
constexpr std::size_t kMostListed = 12;              // columns in a message
constexpr std::size_t kLongestShown = 40;            // bytes of a field in a message

struct Row {
  std::string text;
  std::uint64_t number = 0;
};

struct Options {
  std::string selector;
  std::uint64_t skip = 0;
  std::uint64_t headerRow = 0;  // 0: not said
  bool hasNoHeader = false;
  char decimal = 0;
};

// In UTF-8, cut between characters where it is long.
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

bool isComment(std::string_view row) { return row.front() == '#' || row.front() == '%'; }

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

char readDecimal(Parameters& parameters) {
  const auto decimal = parameters.text("decimal");
  if (!decimal) return 0;
  if (*decimal != "." && *decimal != ",") parameters.refuseValue("decimal", "a point or a comma");
  return decimal->front();
}

std::string readSelector(Parameters& parameters) {
  const auto selector = parameters.text(kSelector);
  const auto column = parameters.text("column");
  if (selector && column) parameters.refuse("the column is given twice");
  if (column && column->empty()) parameters.refuseValue("column", "a name or a number");
  return selector ? *selector : column.value_or("");
}

Options readOptions(Parameters& parameters) {
  Options options;
  options.selector = readSelector(parameters);
  options.skip = parameters.integer<std::uint64_t>("skip", 0, "a number of rows");
  options.hasNoHeader = parameters.text("header") == "none";
  if (!options.hasNoHeader) options.headerRow = parameters.integer<std::uint64_t>("header", 0, "a row or \"none\"");
  if (parameters.has("header") && !options.hasNoHeader && options.headerRow <= options.skip) {
    parameters.refuse("the row of the names is not one that is left after those skipped");
  }
  options.decimal = readDecimal(parameters);
  return options;
}

class CsvFile {
 public:
  CsvFile(const std::string& path, Parameters& parameters, const SourceFormat& format)
      : source_(parameters.source()),
        path_(path),
        options_(readOptions(parameters)),
        scale_(readScale(parameters)),
        lines_(source_, path),
        format_(format) {
    parameters.checkAllUsed();
    dialect_.decimal = options_.decimal;
  }

  LoadedWaveform load() {
    findFirstRow();
    findSeparator();
    findNames();
    countColumns();
    chooseColumn();
    return readColumn();
  }

 private:
  [[noreturn]] void refuse(const std::string& reason, const std::string& help = {}) const {
    throw Refusal(source_ + ": " + reason, help);
  }

  std::vector<std::string> split(const Row& row) const {
    const auto fields = splitRow(row.text, dialect_.separator);
    if (!fields)
      refuse("row " + std::to_string(row.number) + " has a quote that ends in the middle of a field, or never");
    return *fields;
  }

  // --- What stands before the numbers.

  void findFirstRow() {
    for (std::string_view line; lines_.next(line);) {
      if (lines_.row() == 1 && takeSeparatorRow(line)) continue;
      if (lines_.row() <= std::max(options_.skip, options_.headerRow)) {
        if (lines_.row() == options_.headerRow) takeNamesRow(line);
      } else if (const std::string_view text = trimBlanks(line); !text.empty() && !isComment(text)) {
        first_ = {std::string(line), lines_.row()};
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
    before_.push_back(first_);
  }

  bool takeSeparatorRow(std::string_view text) {
    if (text.starts_with('"') && text.ends_with('"') && text.size() > 2) text = text.substr(1, text.size() - 2);
    const bool isSaid =
        text.size() == 5 && text.starts_with("sep=") && kSeparators.find(text.back()) != std::string::npos;
    if (!isSaid) return false;
    dialect_.separator = text.back();
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
    std::string_view text = first_.text;
    while (text.starts_with(' ')) text.remove_prefix(1);
    while (text.ends_with(' ')) text.remove_suffix(1);
    dialect_.separator = separatorOf(text);
    if (dialect_.separator == ',' && !isSeparatedByCommas(text)) {
      dialect_.separator = text.find(' ') == std::string_view::npos ? kOneColumn : ' ';
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
    refuse("row " + std::to_string(first_.number) + ", " + quote(text) +
               ", is one number with a decimal comma or two columns",
           "Say which: decimal=, for one number, decimal=. for two columns.");
  }

  // --- Names and columns.

  void findNames() {
    if (options_.hasNoHeader || before_.empty()) return;
    if (before_.size() > 1) {
      const auto units = split(before_.back());
      const Row& above = before_[before_.size() - 2];
      if (areUnits(units) && !areUnits(split(above)) && split(above).size() == units.size()) before_.pop_back();
    }
    if (options_.headerRow > 0) before_.resize(1);
    namesRow_ = before_.back().number;
    names_ = split(before_.back());
    if (options_.headerRow == 0 && isAnyNumberLike(names_)) refuseMixedRow(before_.back());
    std::ranges::transform(names_, names_.begin(), toUtf8);
    before_.clear();
  }

  [[noreturn]] void refuseMixedRow(const Row& row) const {
    const std::string number = std::to_string(row.number);
    refuse("row " + number + ", " + quote(trimBlanks(row.text)) + ", is neither names nor numbers",
           "If it names the columns, say header=" + number + "; if it is no part of the table, skip=" + number + ".");
  }

  void countColumns() {
    firstFields_ = split(first_);
    mostFields_ = firstFields_.size();
    columns_ = countWithoutEmptyEnd(firstFields_);
    if (names_.empty()) return;
    checkNamesCount();
    mostFields_ = std::max(mostFields_, names_.size());
    columns_ = std::max(columns_, countWithoutEmptyEnd(names_));
  }

  void checkNamesCount() const {
    const bool namesAreOfOther =
        dialect_.separator == kOneColumn && separatorOf(names_[0]) != kOneColumn && separatorOf(names_[0]) != ' ';
    const bool fits = countWithoutEmptyEnd(names_) <= firstFields_.size() && names_.size() >= columns_;
    if (fits && !namesAreOfOther) return;
    refuse("row " + std::to_string(namesRow_) + " names " +
               (namesAreOfOther ? "several columns" : countOf(countWithoutEmptyEnd(names_), "column")) + ", and row " +
               std::to_string(first_.number) + " has " + countOf(columns_, "field"),
           "If it does not name the columns, say so: skip=" + std::to_string(first_.number - 1) + ",header=none.");
  }

  void chooseColumn() {
    column_ = options_.selector.empty() ? chooseDefault() : findSelected();
    if (column_ < columns_) return;
    refuse("there is no column " + std::to_string(column_ + 1), "The file has " + countOf(columns_, "column") + ".");
  }

  std::size_t chooseDefault() {
    if (columns_ == 1) return 0;
    std::vector<std::size_t> others;
    for (std::size_t i = 0; i < names_.size() && i < columns_; ++i) {
      if (namesTime(names_[i])) continue;
      others.push_back(i);
    }
    if (others.size() != 1 || columns_ > names_.size()) refuseToChoose();
    for (std::size_t i = 0; i < columns_; ++i) {
      if (i != others[0]) passedOver_ += (passedOver_.empty() ? "" : ", ") + quote(names_[i]);
    }
    return others[0];
  }

  [[noreturn]] void refuseToChoose() const {
    const bool isSimple = !names_.empty() && names_.back().find_first_of(",\"=") == std::string::npos;
    refuse("has " + countOf(columns_, "column") + ", and which of them is meant is not said",
           "They are " + listColumns() + ". Choose one by its name or number: " + path_ + ":" +
               (isSimple && !names_.back().empty() ? names_.back() : std::to_string(columns_)));
  }

  std::string listColumns() const {
    std::vector<std::string> texts;
    for (std::size_t i = 0; i < std::min(columns_, kMostListed); ++i) {
      const std::string value = i < firstFields_.size() ? firstFields_[i] : "";
      texts.push_back(nameColumn(i) + " (" + shorten(value) + " \u2026)");
    }
    return join(texts) + (columns_ > kMostListed ? " and more" : "");
  }

  std::string nameColumn(std::size_t column) const {
    const bool isNamed = column < names_.size() && !names_[column].empty();
    return std::to_string(column + 1) + (isNamed ? " " + quote(names_[column]) : "");
  }

  std::size_t findSelected() const {
    const auto count = std::ranges::count(names_, options_.selector);
    if (count > 1) refuse("several columns are called " + quote(options_.selector), "Choose one by its number.");
    const auto number = parseInteger<std::size_t>(options_.selector);
    if (count == 0 && number && *number >= 1) return *number - 1;
    if (count == 0) refuseSelector();
    return static_cast<std::size_t>(std::ranges::find(names_, options_.selector) - names_.begin());
  }

  [[noreturn]] void refuseSelector() const {
    const std::string hint = didYouMean(options_.selector, names_);
    const std::string flag =
        didYouMean(options_.selector.substr(options_.selector.rfind(',') + 1), fileParameterNames(), "the parameter ");
    refuse("there is no column " + quote(options_.selector), !hint.empty() ? hint
                                                             : !flag.empty()
                                                                 ? flag
                                                                 : "The columns are " + listColumns() + ".");
  }

  // --- The numbers.

  LoadedWaveform readColumn() {
    SampleScaler scaler(source_, format_, scale_);
    addRow(scaler, first_.text, first_.number);
    for (std::string_view line; lines_.next(line);) {
      const std::size_t first = line.find_first_not_of(" \t\r");
      if (first == std::string_view::npos || isComment(line.substr(first))) continue;
      addRow(scaler, line, lines_.row());
    }
    return scaler.finish(describe());
  }

  void addRow(SampleScaler& scaler, std::string_view line, std::uint64_t row) {
    if (line.find('"') != std::string_view::npos) return addQuotedRow(scaler, line, row);
    const FieldOfRow field = findField(line, dialect_.separator, column_);
    if (field.fields != mostFields_) checkFieldCount(split({std::string(line), row}), row);
    scaler.add(readNumber(field.text, row));
  }

  void addQuotedRow(SampleScaler& scaler, std::string_view line, std::uint64_t row) {
    const auto fields = split({std::string(line), row});
    checkFieldCount(fields, row);
    scaler.add(readNumber(fields[column_], row));
  }

  void checkFieldCount(const std::vector<std::string>& fields, std::uint64_t row) const {
    if (countWithoutEmptyEnd(fields) <= mostFields_ && fields.size() >= columns_) return;
    refuse("row " + std::to_string(row) + " has " + countOf(fields.size(), "field") + ", and row " +
               std::to_string(first_.number) + " has " + std::to_string(firstFields_.size()),
           "Every row must have the same columns.");
  }

  double readNumber(std::string_view field, std::uint64_t row) {
    if (dialect_.decimal == 0) noteDecimal(field, row);
    const auto value = parseField(field, dialect_.decimal);
    if (value && std::isfinite(*value)) return *value;
    const std::string place = "row " + std::to_string(row) + ", column " + std::to_string(column_ + 1);
    if (field.empty()) refuse(place + " is empty", "Every row must have a number there.");
    refuse(place + ": " + quote(field) + (value ? " is not a finite number" : " is not a number"),
           value ? "" : helpFor(field, row));
  }

  // The decimal sign that comes first is that of all numbers.
  void noteDecimal(std::string_view field, std::uint64_t row) {
    const std::size_t sign = field.find_first_of(".,");
    if (sign == std::string_view::npos) return;
    dialect_.decimal = field[sign];
    decimalRow_ = row;
  }

  std::string helpFor(std::string_view field, std::uint64_t row) const {
    const bool hasOtherSign = field.find(dialect_.decimal == ',' ? '.' : ',') != std::string_view::npos;
    if (hasOtherSign && decimalRow_ > 0 && decimalRow_ < row) {
      return "Row " + std::to_string(decimalRow_) + " has a decimal " + (dialect_.decimal == ',' ? "comma." : "point.");
    }
    if (hasOtherSign && options_.decimal != 0) return std::string("decimal=") + options_.decimal + " was said.";
    if (row == first_.number) return "Put it right, or say where the numbers begin: header=ROW or skip=ROWS.";
    return {};
  }

  std::string describe() const {
    std::string text = "column " + nameColumn(column_) + " of " + std::to_string(columns_);
    if (!passedOver_.empty()) text += " (not " + passedOver_ + ")";
    if (first_.number > 2) text += ", from row " + std::to_string(first_.number) + " on";
    if (dialect_.decimal == ',') text += ", decimal commas";
    if (scale_.areCodes) text += ", as sample codes";
    return text;
  }

  const std::string& source_;
  std::string path_;
  Options options_;
  Scale scale_;
  TextLines lines_;
  SourceFormat format_;
  std::vector<Row> before_;  // text in front of the first row of numbers
  std::size_t textRows_ = 0;
  Row first_;
  CsvDialect dialect_;
  bool isSeparatorSaid_ = false;
  std::uint64_t namesRow_ = 0;
  std::vector<std::string> names_;  // none: the columns have no names
  std::vector<std::string> firstFields_;
  std::size_t columns_ = 0;
  std::size_t mostFields_ = 0;  // with empty ones at the end
  std::size_t column_ = 0;      // the chosen one, from 0
  std::string passedOver_;      // names of the columns that hold times
  std::uint64_t decimalRow_ = 0;
};

}  // namespace

LoadedWaveform loadCsvColumn(const std::string& path, Parameters& parameters, const SourceFormat& format) {
  return CsvFile(path, parameters, format).load();
}

}  // namespace tools
