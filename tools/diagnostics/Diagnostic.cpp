#include "tools/diagnostics/Diagnostic.h"

#include <algorithm>
#include <iterator>

#include "tools/text/characters.h"

namespace tools {
namespace {

constexpr std::size_t kLongestShown = 160;  // bytes of a source line
constexpr std::size_t kShownBefore = 60;    // of those, before the place when the line is longer
constexpr std::string_view kEllipsis = "\u2026";
constexpr std::string_view kDelimiters = " \t\r\n(),/";

bool isContinuation(char c) { return (static_cast<unsigned char>(c) & 0xC0) == 0x80; }

// The part of a line that is shown, and where in it the place is.
struct Excerpt {
  std::string_view text;
  std::size_t place;  // bytes from its start
  bool isCutBefore;
  bool isCutBehind;
};

Excerpt makeExcerpt(std::string_view line, std::size_t place) {
  place = std::min(place, line.size());
  std::size_t first = line.size() > kLongestShown && place > kShownBefore ? place - kShownBefore : 0;
  while (first > 0 && first < place && isContinuation(line[first])) ++first;
  std::size_t end = std::min(line.size(), first + kLongestShown);
  while (end > place && end < line.size() && isContinuation(line[end])) --end;
  return {line.substr(first, end - first), place - first, first > 0, end < line.size()};
}

// A caret under the first column of the word at the place, and tildes under the rest of it.
std::string underline(std::string_view word) {
  const std::size_t columns = std::max<std::size_t>(1, blanksFor(word).size());
  return "^" + std::string(columns - 1, '~');
}

std::string padLeft(const std::string& text, std::size_t width) {
  return std::string(width - std::min(width, text.size()), ' ') + text;
}

std::string gutterOf(Place place) {
  return std::string(std::max<std::size_t>(5, std::to_string(place.line).size()), ' ');
}

std::string formatSource(const ScriptFile& file, Place place, std::size_t length) {
  const std::string gutter = gutterOf(place);
  const Excerpt excerpt = makeExcerpt(file.line(place.line), std::max(1u, place.position) - 1);
  const std::string_view rest = excerpt.text.substr(excerpt.place);
  const std::string_view word = rest.substr(0, length == 0 ? rest.find_first_of(kDelimiters) : length);
  const std::string_view before = excerpt.isCutBefore ? kEllipsis : std::string_view();
  const std::string_view behind = excerpt.isCutBehind ? kEllipsis : std::string_view();
  return padLeft(std::to_string(place.line), gutter.size()) + " | " + std::string(before) + toPrintable(excerpt.text) +
         std::string(behind) + "\n" + gutter + " | " + blanksFor(before) +
         blanksFor(excerpt.text.substr(0, excerpt.place)) + underline(word) + "\n";
}

// "pulses.kts:2:5: error: message", and the line of the place.
std::string formatPlace(const ScriptFile& file, Place place, std::size_t length, const std::string& kind,
                        const std::string& message) {
  std::string text = toPrintable(file.name()) + ":";
  if (place.isKnown()) text += std::to_string(place.line) + ":" + std::to_string(place.position) + ":";
  text += " " + kind + ": " + toPrintable(message) + "\n";
  return place.isKnown() ? text + formatSource(file, place, length) : text;
}

}  // namespace

const char* severityText(Diagnostic::Severity severity) {
  return severity == Diagnostic::Severity::kError ? "error" : "warning";
}

FixedText applyCertainFixes(std::string_view text, std::span<const Diagnostic> diagnostics) {
  std::vector<Diagnostic::Fix> fixes;
  for (const Diagnostic& diagnostic : diagnostics) {
    std::ranges::copy_if(diagnostic.fixes, std::back_inserter(fixes), &Diagnostic::Fix::isCertain);
  }
  std::ranges::stable_sort(fixes, {}, &Diagnostic::Fix::offset);
  FixedText fixed;
  std::size_t copied = 0;  // bytes of the text
  for (const Diagnostic::Fix& fix : fixes) {
    if (fix.offset < copied) continue;
    fixed.text.append(text.substr(copied, fix.offset - copied)).append(fix.text);
    copied = fix.offset + fix.length;
    ++fixed.count;
  }
  fixed.text.append(text.substr(copied));
  return fixed;
}

std::string formatDiagnostic(const Diagnostic& diagnostic, const ScriptFile& file) {
  const std::string gutter = gutterOf(diagnostic.place);
  std::string text =
      formatPlace(file, diagnostic.place, diagnostic.length, severityText(diagnostic.severity), diagnostic.message);
  if (!diagnostic.help.empty()) text += gutter + " = " + toPrintable(diagnostic.help) + "\n";
  if (!diagnostic.constant.empty()) {
    text += gutter + " = " + diagnostic.constant + " (" + std::to_string(diagnostic.code) + ")\n";
  }
  for (const Diagnostic::Related& related : diagnostic.related) {
    text += formatNote(file, related.place, related.message);
  }
  return text;
}

std::string formatNote(const ScriptFile& file, Place place, const std::string& message) {
  return formatPlace(file, place, 0, "note", message);
}

}  // namespace tools
