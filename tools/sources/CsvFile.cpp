#include "tools/sources/CsvFile.h"

#include <algorithm>
#include <cmath>

#include "tools/sources/CsvLayout.h"
#include "tools/sources/SampleScaler.h"
#include "tools/sources/columnNames.h"
#include "tools/text/Refusal.h"
#include "tools/text/nearMiss.h"
#include "tools/text/words.h"

namespace tools {
namespace {

constexpr std::size_t kMostListed = 12;  // columns in a message

char readDecimal(Parameters& parameters) {
  const auto decimal = parameters.text("decimal");
  if (!decimal) return 0;
  if (*decimal != "." && *decimal != ",") parameters.refuseValue("decimal", "a point or a comma");
  return decimal->front();
}

CsvOptions readOptions(Parameters& parameters) {
  CsvOptions options;
  options.selector = parameters.choice("column");
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
  }

  LoadedWaveform load() {
    layout_ = findCsvLayout(source_, lines_, options_);
    chooseColumn();
    return readColumn();
  }

 private:
  [[noreturn]] void refuse(const std::string& reason, const std::string& help = {}) const {
    throw Refusal(source_ + ": " + reason, help);
  }

  void chooseColumn() {
    column_ = options_.selector.empty() ? chooseDefault() : findSelected();
    if (column_ < layout_.columns) return;
    refuse("there is no column " + std::to_string(column_ + 1),
           "The file has " + countOf(layout_.columns, "column") + ".");
  }

  std::size_t chooseDefault() {
    if (layout_.columns == 1) return 0;
    std::vector<std::size_t> others;
    for (std::size_t i = 0; i < layout_.names.size() && i < layout_.columns; ++i) {
      if (namesTime(layout_.names[i])) continue;
      others.push_back(i);
    }
    if (others.size() != 1 || layout_.columns > layout_.names.size()) refuseToChoose();
    for (std::size_t i = 0; i < layout_.columns; ++i) {
      if (i != others[0]) passedOver_ += (passedOver_.empty() ? "" : ", ") + quote(layout_.names[i]);
    }
    return others[0];
  }

  [[noreturn]] void refuseToChoose() const {
    const bool isSimple = !layout_.names.empty() && layout_.names.back().find_first_of(",\"=") == std::string::npos;
    refuse("has " + countOf(layout_.columns, "column") + ", and which of them is meant is not said",
           "They are " + listColumns() + ". Choose one by its name or number: " + path_ + ":" +
               (isSimple && !layout_.names.back().empty() ? layout_.names.back() : std::to_string(layout_.columns)));
  }

  std::string listColumns() const {
    std::vector<std::string> texts;
    for (std::size_t i = 0; i < std::min(layout_.columns, kMostListed); ++i) {
      const std::string value = i < layout_.firstFields.size() ? layout_.firstFields[i] : "";
      texts.push_back(nameColumn(i) + " (" + shorten(value) + " \u2026)");
    }
    return join(texts) + (layout_.columns > kMostListed ? " and more" : "");
  }

  std::string nameColumn(std::size_t column) const {
    const bool isNamed = column < layout_.names.size() && !layout_.names[column].empty();
    return std::to_string(column + 1) + (isNamed ? " " + quote(layout_.names[column]) : "");
  }

  std::size_t findSelected() const {
    const auto count = std::ranges::count(layout_.names, options_.selector);
    if (count > 1) refuse("several columns are called " + quote(options_.selector), "Choose one by its number.");
    const auto number = parseInteger<std::size_t>(options_.selector);
    if (count == 0 && number && *number >= 1) return *number - 1;
    if (count == 0) refuseSelector();
    return static_cast<std::size_t>(std::ranges::find(layout_.names, options_.selector) - layout_.names.begin());
  }

  [[noreturn]] void refuseSelector() const {
    const std::string hint = tellSimilar("column", options_.selector, layout_.names);
    const std::string flag =
        tellSimilar("parameter", options_.selector.substr(options_.selector.rfind(',') + 1), fileParameterNames());
    refuse("there is no column " + quote(options_.selector), !hint.empty() ? hint
                                                             : !flag.empty()
                                                                 ? flag
                                                                 : "The columns are " + listColumns() + ".");
  }

  // --- The numbers.

  LoadedWaveform readColumn() {
    SampleScaler scaler(source_, format_, scale_);
    addRow(scaler, layout_.first.text, layout_.first.number);
    for (std::string_view line; lines_.next(line);) {
      const std::size_t first = line.find_first_not_of(" \t\r");
      if (first == std::string_view::npos || isCsvComment(line.substr(first))) continue;
      addRow(scaler, line, lines_.row());
    }
    return scaler.finish(describe());
  }

  void addRow(SampleScaler& scaler, std::string_view line, std::uint64_t row) {
    if (line.find('"') != std::string_view::npos) return addQuotedRow(scaler, line, row);
    const FieldOfRow field = findField(line, layout_.dialect.separator, column_);
    if (field.fields != layout_.mostFields)
      checkFieldCount(splitRow(source_, {std::string(line), row}, layout_.dialect.separator), row);
    scaler.add(readNumber(field.text, row));
  }

  void addQuotedRow(SampleScaler& scaler, std::string_view line, std::uint64_t row) {
    const auto fields = splitRow(source_, {std::string(line), row}, layout_.dialect.separator);
    checkFieldCount(fields, row);
    scaler.add(readNumber(fields[column_], row));
  }

  void checkFieldCount(const std::vector<std::string>& fields, std::uint64_t row) const {
    if (countWithoutEmptyEnd(fields) <= layout_.mostFields && fields.size() >= layout_.columns) return;
    refuse("row " + std::to_string(row) + " has " + countOf(fields.size(), "field") + ", and row " +
               std::to_string(layout_.first.number) + " has " + std::to_string(layout_.firstFields.size()),
           "Every row must have the same columns.");
  }

  double readNumber(std::string_view field, std::uint64_t row) {
    if (layout_.dialect.decimal == 0) noteDecimal(field, row);
    const auto value = parseField(field, layout_.dialect.decimal);
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
    layout_.dialect.decimal = field[sign];
    decimalRow_ = row;
  }

  std::string helpFor(std::string_view field, std::uint64_t row) const {
    const bool hasOtherSign = field.find(layout_.dialect.decimal == ',' ? '.' : ',') != std::string_view::npos;
    if (hasOtherSign && decimalRow_ > 0 && decimalRow_ < row) {
      return "Row " + std::to_string(decimalRow_) + " has a decimal " +
             (layout_.dialect.decimal == ',' ? "comma." : "point.");
    }
    if (hasOtherSign && options_.decimal != 0) return std::string("decimal=") + options_.decimal + " was said.";
    if (row == layout_.first.number) return "Put it right, or say where the numbers begin: header=ROW or skip=ROWS.";
    return {};
  }

  std::string describe() const {
    std::string text = "column " + nameColumn(column_) + " of " + std::to_string(layout_.columns);
    if (!passedOver_.empty()) text += " (not " + passedOver_ + ")";
    if (layout_.first.number > 2) text += ", from row " + std::to_string(layout_.first.number) + " on";
    if (layout_.dialect.decimal == ',') text += ", decimal commas";
    if (scale_.areCodes) text += ", as sample codes";
    return text;
  }

  const std::string& source_;
  std::string path_;
  CsvOptions options_;
  Scale scale_;
  TextLines lines_;
  SourceFormat format_;
  CsvLayout layout_;
  std::size_t column_ = 0;        // the chosen one, from 0
  std::string passedOver_;        // names of the columns that hold times
  std::uint64_t decimalRow_ = 0;  // the first with a decimal sign
};

}  // namespace

LoadedWaveform loadCsvColumn(const std::string& path, Parameters& parameters, const SourceFormat& format) {
  return CsvFile(path, parameters, format).load();
}

}  // namespace tools
