#include "tools/sources/Parameters.h"

#include <algorithm>
#include <array>

#include "tools/text/Refusal.h"
#include "tools/text/characters.h"
#include "tools/text/nearMiss.h"
#include "tools/text/quantities.h"

namespace tools {
namespace {

constexpr std::array<std::string_view, 3> kFlags = {"codes", "normalise", "resample"};
constexpr std::array<std::string_view, 10> kValues = {"channel", "column", "decimal", "full-scale", "gain",
                                                      "header",  "member", "offset",  "rate",       "skip"};

template <typename Names>
bool contains(const Names& names, std::string_view name) {
  return std::ranges::find(names, name) != names.end();
}

bool canStandInKey(char c) { return c == '-' || (toLower(c) >= 'a' && toLower(c) <= 'z'); }

// What stands before '=', where that can be the name of a parameter.
std::string_view keyOf(std::string_view text) {
  const std::size_t equals = text.substr(0, text.find(',')).find('=');
  if (equals == std::string_view::npos || !std::ranges::all_of(text.substr(0, equals), canStandInKey)) return {};
  return text.substr(0, equals);
}

class FileParameterParser {
 public:
  FileParameterParser(const std::string& source, std::string_view text) : parameters_(source), rest_(text) {}

  Parameters parse() {
    if (!rest_.empty() && !beginsParameter()) parameters_.give(kSelector, takeValue());
    while (!rest_.empty()) takeParameter();
    return std::move(parameters_);
  }

 private:
  std::string_view firstPiece() const { return rest_.substr(0, rest_.find(',')); }
  bool beginsParameter() const { return contains(kFlags, firstPiece()) || !keyOf(rest_).empty(); }

  void skip(std::size_t count) { rest_.remove_prefix(std::min(count, rest_.size())); }

  void takeParameter() {
    const std::string key(keyOf(rest_));
    if (key.empty()) return takeFlag();
    if (!contains(kValues, key)) refuseUnknown(key);
    skip(key.size() + 1);
    parameters_.give(key, takeValue());
  }

  void takeFlag() {
    const std::string flag(firstPiece());
    if (!contains(kFlags, flag)) refuseUnknown(flag);
    parameters_.give(flag, "");
    skip(flag.size() + 1);
  }

  std::string takeValue() {
    if (rest_.starts_with('"')) return takeQuoted();
    std::string value;
    while (true) {
      const std::string_view piece = firstPiece();
      const bool isLast = piece.size() == rest_.size();
      value += piece;
      skip(piece.size() + 1);
      if (isLast || beginsParameter()) return value;
      value += ',';
    }
  }

  std::string takeQuoted() {
    std::string value;
    skip(1);
    while (!rest_.empty()) {
      const bool isQuote = rest_.front() == '"';
      const bool isDoubled = rest_.starts_with("\"\"");
      if (isQuote && !isDoubled) return endQuoted(value);
      value += rest_.front();
      skip(isDoubled ? 2 : 1);
    }
    parameters_.refuse("a quote has no end", "In quotes, a quote is written twice.");
  }

  std::string endQuoted(const std::string& value) {
    skip(1);
    if (!rest_.empty() && !rest_.starts_with(',')) parameters_.refuse("a comma is missing behind the quoted value");
    skip(1);
    return value;
  }

  [[noreturn]] void refuseUnknown(const std::string& name) const {
    const auto names = fileParameterNames();
    const std::string hint = tellSimilar("parameter", name, names);
    parameters_.refuse("there is no parameter \"" + name + "\"", hint.empty() ? "It has " + join(names) + "." : hint);
  }

  Parameters parameters_;
  std::string_view rest_;
};

}  // namespace

void Parameters::give(const std::string& key, const std::string& value) {
  if (!given_.emplace(key, value).second) refuse("\"" + key + "\" is given twice");
}

std::optional<std::string> Parameters::text(const std::string& key) {
  if (!contains(known_, key)) known_.push_back(key);
  const auto found = given_.find(key);
  return found == given_.end() ? std::nullopt : std::optional(found->second);
}

double Parameters::number(const std::string& key, double otherwise) {
  const auto given = text(key);
  if (!given) return otherwise;
  if (const auto value = parseNumber(*given)) return *value;
  refuseValue(key, "a number");
}

std::string Parameters::choice(const std::string& key) {
  const auto first = text(kSelector);
  const auto named = text(key);
  if (first && named) refuse("the " + key + " is given twice");
  if (named && named->empty()) refuseValue(key, "a name or a number");
  return first ? *first : named.value_or("");
}

void Parameters::refuse(const std::string& reason, const std::string& help) const {
  throw Refusal(source_ + ": " + reason, help);
}

void Parameters::refuseValue(const std::string& key, const std::string& what) const {
  refuse(key + "=" + given_.at(key) + " is not " + what);
}

void Parameters::checkAllUsed() const {
  std::vector<std::string> names = known_;
  std::erase(names, kSelector);
  for (const auto& [key, value] : given_) {
    if (contains(known_, key)) continue;
    if (key == kSelector) refuse("there is nothing to choose by \"" + value + "\"");
    const std::string hint = tellSimilar("parameter", key, names);
    refuse("there is no parameter \"" + key + "\"", (hint.empty() ? "" : hint + " ") + "It has " + join(names) + ".");
  }
}

std::vector<std::string> fileParameterNames() {
  std::vector<std::string> names(kValues.begin(), kValues.end());
  names.insert(names.end(), kFlags.begin(), kFlags.end());
  return names;
}

Parameters parseShapeParameters(const std::string& source, std::string_view text) {
  Parameters parameters(source);
  while (!text.empty()) {
    const std::string_view item = text.substr(0, text.find(','));
    text.remove_prefix(std::min(text.size(), item.size() + 1));
    const std::size_t equals = item.find('=');
    if (equals == std::string_view::npos) {
      parameters.refuse("\"" + std::string(item) + "\" is not of the form parameter=value");
    }
    parameters.give(std::string(item.substr(0, equals)), std::string(item.substr(equals + 1)));
  }
  return parameters;
}

Parameters parseFileParameters(const std::string& source, std::string_view text) {
  return FileParameterParser(source, text).parse();
}

}  // namespace tools
