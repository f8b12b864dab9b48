// The parameters of a source: what stands behind the colon of "file.csv:column=volts,gain=2". Each is asked for by its
// name, and what nobody asked for is an error. One thread at a time.
#pragma once

#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "tools/text/words.h"

namespace tools {

// What stands first without a name, "volts" in "file.csv:volts,gain=2", is given under this one.
inline constexpr char kSelector[] = "";

class Parameters {
 public:
  // `source` is what messages call it.
  explicit Parameters(std::string source) : source_(std::move(source)) {}

  // Throws Refusal when the parameter was given before.
  void give(const std::string& key, const std::string& value);

  // The parameter as it was given, if it was; the others throw Refusal for a value that is not of their kind.
  std::optional<std::string> text(const std::string& key);
  bool flag(const std::string& key) { return text(key).has_value(); }
  double number(const std::string& key, double otherwise);
  template <typename Integer>
  Integer integer(const std::string& key, Integer otherwise, const char* what = "a whole number");

  // What is chosen by the selector or by the parameter of that name, which is the same; empty: nothing. Throws Refusal
  // where both are given.
  std::string choice(const std::string& key);

  bool has(const std::string& key) const { return given_.contains(key); }
  const std::string& source() const { return source_; }

  [[noreturn]] void refuse(const std::string& reason, const std::string& help = {}) const;
  [[noreturn]] void refuseValue(const std::string& key, const std::string& what) const;
  // Throws Refusal for a parameter that was never asked for.
  void checkAllUsed() const;

 private:
  std::string source_;
  std::map<std::string, std::string> given_;
  std::vector<std::string> known_;
};

template <typename Integer>
Integer Parameters::integer(const std::string& key, Integer otherwise, const char* what) {
  const auto given = text(key);
  if (!given) return otherwise;
  if (const auto value = parseInteger<Integer>(*given)) return *value;
  refuseValue(key, what);
}

// The names of everything that a file may be given.
std::vector<std::string> fileParameterNames();

// Parameters of a shape: "length=1000,cycles=10".
Parameters parseShapeParameters(const std::string& source, std::string_view text);

// Parameters of a file: a selector, parameters with values, and flags ("codes"). A comma belongs to the value before it
// unless another parameter follows ("level, V,gain=2"), and to a value in quotes always (column="a,codes").
Parameters parseFileParameters(const std::string& source, std::string_view text);

}  // namespace tools
