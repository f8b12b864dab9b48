#include "tools/diagnostics/Diagnostic.h"

#include <algorithm>
#include <iterator>

#include "tools/text/characters.h"

namespace tools {
namespace {

constexpr std::size_t kLeastRoom = 16;   // columns for a source line
constexpr std::size_t kTabColumns = 8;   // at most
constexpr std::size_t kLeastGutter = 5;  // columns of the number of a line
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

// The most columns that a byte can take: no character has more columns than bytes.
std::size_t columnsOf(char byte) { return byte == '\t' ? kTabColumns : 1; }

// The end of as many bytes from `first` on as surely fit into that many columns.
std::size_t endWithin(std::string_view line, std::size_t first, std::size_t columns) {
  std::size_t end = first;
  for (std::size_t taken = 0; end < line.size(); ++end) {
    taken += columnsOf(line[end]);
    if (taken > columns) break;
  }
  return end;
}

// The same in front of `end`.
std::size_t startWithin(std::string_view line, std::size_t end, std::size_t columns) {
  std::size_t first = end;
  for (std::size_t taken = 0; first > 0; --first) {
    taken += columnsOf(line[first - 1]);
    if (taken > columns) break;
  }
  return first;
}

Excerpt makeExcerpt(std::string_view line, std::size_t place, std::size_t room) {
  place = std::min(place, line.size());
  std::size_t first = endWithin(line, 0, room) < line.size() ? startWithin(line, place, room * 3 / 8) : 0;
  while (first > 0 && first < place && isContinuation(line[first])) ++first;
  std::size_t end = endWithin(line, first, room);
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
  return std::string(std::max(kLeastGutter, std::to_string(place.line).size()), ' ');
}

// Room for the line itself: its number, " | ", both ellipses and the last column of a terminal are not.
std::size_t roomWithin(int columns, const std::string& gutter) {
  const std::size_t taken = gutter.size() + 3 + 2 + 1;
  return std::max(kLeastRoom + taken, static_cast<std::size_t>(std::max(0, columns))) - taken;
}

std::string formatSource(const ScriptFile& file, Place place, std::size_t length, int columns) {
  const std::string gutter = gutterOf(place);
  const Excerpt excerpt =
      makeExcerpt(file.line(place.line), std::max(1u, place.position) - 1, roomWithin(columns, gutter));
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
                        const std::string& message, int columns) {
  std::string text = toPrintable(file.name()) + ":";
  if (place.isKnown()) text += std::to_string(place.line) + ":" + std::to_string(place.position) + ":";
  text += " " + kind + ": " + toPrintable(message) + "\n";
  return place.isKnown() ? text + formatSource(file, place, length, columns) : text;
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

std::string formatDiagnostic(const Diagnostic& diagnostic, const ScriptFile& file, int columns) {
  const std::string gutter = gutterOf(diagnostic.place);
  std::string text = formatPlace(file, diagnostic.place, diagnostic.length, severityText(diagnostic.severity),
                                 diagnostic.message, columns);
  if (!diagnostic.help.empty()) text += gutter + " = " + toPrintable(diagnostic.help) + "\n";
  if (!diagnostic.constant.empty()) {
    text += gutter + " = " + diagnostic.constant + " (" + std::to_string(diagnostic.code) + ")\n";
  }
  for (const Diagnostic::Related& related : diagnostic.related) {
    text += formatNote(file, related.place, related.message, columns);
  }
  return text;
}

std::string formatNote(const ScriptFile& file, Place place, const std::string& message, int columns) {
  return formatPlace(file, place, 0, "note", message, columns);
}

}  // namespace tools
