#include "tools/sources/CsvRow.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <limits>

#include "tools/text/characters.h"

namespace tools {
namespace {

constexpr std::string_view kBlanks = " \t\r";
constexpr std::string_view kMistypedNumbers = "0123456789+-.eElIoO";

bool isDigit(char c) { return c >= '0' && c <= '9'; }
bool isBlank(char c) { return kBlanks.find(c) != std::string_view::npos; }

// Cuts a row that may hold quotes.
class RowCutter {
 public:
  RowCutter(std::string_view row, char separator) : rest_(trimEnds(row, separator)), separator_(separator) {}

  std::optional<std::vector<std::string>> cut() {
    do {
      if (!takeField()) return std::nullopt;
    } while (takeSeparator());
    return std::move(fields_);
  }

 private:
  // Blanks at the ends are no fields, unless they part fields.
  static std::string_view trimEnds(std::string_view row, char separator) {
    return separator == '\t' ? row : trimBlanks(row);
  }

  bool takeField() {
    while (!rest_.empty() && rest_.front() == ' ') rest_.remove_prefix(1);
    if (rest_.starts_with('"')) return takeQuoted();
    const std::size_t end = separator_ == kOneColumn ? rest_.size() : std::min(rest_.find(separator_), rest_.size());
    fields_.emplace_back(trimBlanks(rest_.substr(0, end)));
    rest_.remove_prefix(end);
    return true;
  }

  bool takeQuoted() {
    std::string field;
    for (std::size_t i = 1; i < rest_.size(); ++i) {
      if (rest_[i] == '"' && !rest_.substr(i + 1).starts_with('"')) return endQuoted(field, i + 1);
      if (rest_[i] == '"') ++i;
      field += rest_[i];
    }
    return false;
  }

  bool endQuoted(const std::string& field, std::size_t end) {
    fields_.push_back(field);
    rest_.remove_prefix(end);
    const bool endsAtBlank = separator_ == ' ' || separator_ == '\t';
    while (!endsAtBlank && !rest_.empty() && isBlank(rest_.front())) rest_.remove_prefix(1);
    return rest_.empty() || (separator_ != kOneColumn && rest_.front() == separator_);
  }

  bool takeSeparator() {
    if (rest_.empty()) return false;
    rest_.remove_prefix(1);
    return true;
  }

  std::string_view rest_;
  char separator_;
  std::vector<std::string> fields_;
};

FieldOfRow findBlankSeparated(std::string_view row, std::size_t column) {
  FieldOfRow found;
  for (std::size_t i = row.find_first_not_of(kBlanks); i != std::string_view::npos;) {
    const std::size_t end = std::min(row.find_first_of(kBlanks, i), row.size());
    if (found.fields++ == column) found = {row.substr(i, end - i), found.fields, true};
    i = row.find_first_not_of(kBlanks, end);
  }
  return found;
}

// As from_chars, but reads "+1", takes what is too small for 0, and what is too great for infinite.
std::optional<double> parseWithPoint(std::string_view text) {
  if (text.starts_with('+') && !text.substr(1).starts_with('-')) text.remove_prefix(1);
  double value = 0;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), value);
  if (end != text.data() + text.size() || error == std::errc::invalid_argument) return std::nullopt;
  if (error == std::errc()) return value;
  const bool isTiny = text.find("e-") != std::string_view::npos || text.find("E-") != std::string_view::npos;
  return isTiny ? 0 : std::numeric_limits<double>::infinity();
}

std::optional<double> parseWithComma(std::string_view text, std::size_t comma) {
  const bool isBetweenDigits = comma + 1 < text.size() && isDigit(text[comma + 1]);
  if (!isBetweenDigits || text.find('.') != std::string_view::npos) return std::nullopt;
  std::string withPoint(text);
  withPoint[comma] = '.';
  return parseWithPoint(withPoint);
}

bool beginsWithWord(std::string_view text, std::string_view word) {
  return std::ranges::equal(text, word, {}, toLower);
}

}  // namespace

std::string_view trimBlanks(std::string_view text) {
  const std::size_t first = text.find_first_not_of(kBlanks);
  if (first == std::string_view::npos) return {};
  return text.substr(first, text.find_last_not_of(kBlanks) - first + 1);
}

std::optional<std::vector<std::string>> splitRow(std::string_view row, char separator) {
  return RowCutter(row, separator).cut();
}

std::size_t countWithoutEmptyEnd(const std::vector<std::string>& fields) {
  std::size_t count = fields.size();
  while (count > 0 && fields[count - 1].empty()) --count;
  return count;
}

FieldOfRow findField(std::string_view row, char separator, std::size_t column) {
  if (separator == ' ') return findBlankSeparated(row, column);
  if (separator == kOneColumn) return {trimBlanks(row), 1, column == 0};
  FieldOfRow found;
  for (std::size_t begin = 0; begin <= row.size();) {
    const std::size_t end = std::min(row.find(separator, begin), row.size());
    if (found.fields++ == column) found = {trimBlanks(row.substr(begin, end - begin)), found.fields, true};
    begin = end + 1;
  }
  return found;
}

std::optional<double> parseField(std::string_view field, char decimal) {
  const std::size_t comma = field.find(',');
  if (comma != std::string_view::npos) return decimal == '.' ? std::nullopt : parseWithComma(field, comma);
  if (decimal == ',' && field.find('.') != std::string_view::npos) return std::nullopt;
  return parseWithPoint(field);
}

bool looksLikeNumber(std::string_view field) {
  const bool isMistyped = field.find('.') != std::string_view::npos &&
                          field.find_first_not_of(kMistypedNumbers) == std::string_view::npos &&
                          std::ranges::any_of(field, isDigit);
  if (!field.empty() && (field.front() == '+' || field.front() == '-')) field.remove_prefix(1);
  if (field.starts_with('.') || field.starts_with(',')) field.remove_prefix(1);
  const bool beginsWithDigit = !field.empty() && isDigit(field.front());
  const bool isNoFinite =
      beginsWithWord(field, "nan") || beginsWithWord(field, "inf") || beginsWithWord(field, "infinity");
  return beginsWithDigit || isMistyped || isNoFinite;
}

}  // namespace tools
