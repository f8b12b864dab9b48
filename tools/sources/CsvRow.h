// One row of a table in text: how it is cut into fields, and what reads as a number.
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace tools {

constexpr char kOneColumn = 0;  // as a separator: the whole row is one field

struct CsvDialect {
  char separator = ',';  // a blank stands for runs of blanks
  char decimal = 0;      // '.' or ','; 0: whichever the numbers have
};

std::string_view trimBlanks(std::string_view text);

// The fields of a row, without the blanks around them and the quotes. Nothing when a quote has no end, or more than
// blanks behind it.
std::optional<std::vector<std::string>> splitRow(std::string_view row, char separator);

// The number of fields without those that are empty at the end.
std::size_t countWithoutEmptyEnd(const std::vector<std::string>& fields);

// One field of a row without quotes, and how many the row has.
struct FieldOfRow {
  std::string_view text;
  std::size_t fields = 0;
  bool isThere = false;
};
FieldOfRow findField(std::string_view row, char separator, std::size_t column);

// The whole field as a number, which may be NaN or infinite; nothing when it is none, or has the other decimal sign.
std::optional<double> parseField(std::string_view field, char decimal);

// Whether it begins as a number does ("0.l", "12 V", "nan"), or consists of what numbers are mistyped with ("l.0"), so
// that it may be a faulty number rather than a name.
bool looksLikeNumber(std::string_view field);

}  // namespace tools
