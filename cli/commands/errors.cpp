#include <algorithm>
#include <optional>

#include "cli/commands/commands.h"
#include "cli/console.h"
#include "kterr/ErrorConstant.h"
#include "kterr/hexText.h"
#include "tools/diagnostics/elaboration.h"
#include "tools/text/Refusal.h"
#include "tools/text/characters.h"
#include "tools/text/nearMiss.h"
#include "tools/text/words.h"

namespace tools::cli {
namespace {

using kterr::ErrorConstant;

std::string nameOf(const ErrorConstant& constant) { return constant.cName; }

// Without the scope in front of it: "kErrorInternalSWError".
std::string shortNameOf(const ErrorConstant& constant) {
  const std::string name = constant.text == nullptr ? constant.cName : constant.text;
  const std::size_t scope = name.rfind("::");
  return scope == std::string::npos ? name : name.substr(scope + 2);
}

std::string hexadecimal(std::int32_t code) { return kterr::hexText(static_cast<std::uint32_t>(code), 8); }

bool isSameLetter(char a, char b) { return toLower(a) == toLower(b); }

bool isSameName(std::string_view a, std::string_view b) { return std::ranges::equal(a, b, isSameLetter); }

// "-1074101568", or the same bits as "3220865728" or "0xBFFA8280".
std::optional<std::int32_t> parseCode(std::string_view text) {
  const bool isHexadecimal = text.starts_with("0x") || text.starts_with("0X");
  if (isHexadecimal) text.remove_prefix(2);
  const auto value = parseInteger<std::int64_t>(text, isHexadecimal ? 16 : 10);
  if (!value || *value < INT32_MIN || *value > UINT32_MAX) return std::nullopt;
  return static_cast<std::int32_t>(*value);
}

std::vector<const ErrorConstant*> find(const std::string& wanted) {
  std::vector<const ErrorConstant*> found;
  const auto code = parseCode(wanted);
  for (const ErrorConstant& constant : kterr::allErrorConstants()) {
    const bool isNamed = isSameName(wanted, nameOf(constant)) || isSameName(wanted, shortNameOf(constant)) ||
                         (constant.text != nullptr && isSameName(wanted, constant.text));
    if (code ? constant.code == *code : isNamed) found.push_back(&constant);
  }
  return found;
}

std::string describe(const ErrorConstant& constant) {
  return nameOf(constant) + " = " + std::to_string(constant.code) + " (" + hexadecimal(constant.code) + ")\n  " +
         constant.meaning + "\n  " + helpOf(constant) + "\n";
}

bool isLike(std::string_view text, std::string_view word) {
  return std::search(text.begin(), text.end(), word.begin(), word.end(), isSameLetter) != text.end();
}

bool mentions(const ErrorConstant& constant, std::string_view word) {
  return isLike(nameOf(constant), word) || isLike(constant.meaning, word) || isLike(helpOf(constant), word);
}

// The errors whose name, meaning or help hold all the words.
std::vector<const ErrorConstant*> search(const std::vector<std::string>& words) {
  std::vector<const ErrorConstant*> found;
  for (const ErrorConstant& constant : kterr::allErrorConstants()) {
    const auto isMentioned = [&constant](const std::string& word) { return mentions(constant, word); };
    if (std::ranges::all_of(words, isMentioned)) found.push_back(&constant);
  }
  return found;
}

[[noreturn]] void refuse(const std::string& wanted) {
  std::vector<std::string> names;
  for (const ErrorConstant& constant : kterr::allErrorConstants()) {
    names.push_back(nameOf(constant));
    names.push_back(shortNameOf(constant));
  }
  const std::string hint = tellSimilar("error", wanted, names);
  throw Refusal("no error of the library has \"" + wanted + "\" as its code, in its name or in what is said of it",
                hint.empty() ? "Without an argument, ktorba errors lists them all." : hint);
}

void describeMatches(const std::vector<std::string>& words) {
  const auto found = search(words);
  if (found.empty()) refuse(join(words, " "));
  for (const ErrorConstant* constant : found) print(describe(*constant));
}

void list() {
  for (const ErrorConstant& constant : kterr::allErrorConstants()) {
    const std::string code = std::to_string(constant.code);
    print(std::string(12 - std::min<std::size_t>(12, code.size()), ' ') + code + "  " + nameOf(constant) + "\n");
  }
}

}  // namespace

int errors(const ErrorsOptions& options) {
  if (options.wanted.empty()) list();
  std::vector<std::string> words;  // that are neither codes nor names
  for (const std::string& wanted : options.wanted) {
    const auto found = find(wanted);
    if (found.empty()) words.push_back(wanted);
    for (const ErrorConstant* constant : found) print(describe(*constant));
  }
  if (!words.empty()) describeMatches(words);
  return kSuccess;
}

}  // namespace tools::cli
