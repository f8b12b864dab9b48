#include "cli/console.h"

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "platform/system/clock.h"
#include "platform/system/terminal.h"
#include "tools/text/characters.h"

namespace tools::cli {
namespace {

constexpr std::uint64_t kShownAfterMs = 500;
constexpr int kWidestBar = 40;
constexpr int kNarrowestBar = 5;
constexpr int kShortestLabel = 8;

struct OptionOfSetting {
  Setting setting;
  const char* option;
};
constexpr OptionOfSetting kOptions[] = {
    {Setting::kSampleWidth, "--sample-width"},
    {Setting::kSampleRate, "--sample-rate"},
    {Setting::kMemory, "--memory"},
    {Setting::kMemoryWord, "--memory-word"},
    {Setting::kMinFetch, "--min-fetch"},
    {Setting::kSequenceMemory, "--sequence-memory"},
    {Setting::kMaxPriming, "--max-priming"},
    {Setting::kWaveform, "--waveform NAME=SOURCE"},
    {Setting::kScriptName, "--script NAME"},
    {Setting::kOutputFormat, "--output-format FORMAT"},
    {Setting::kPictureHeight, "--height POINTS"},
};

constexpr char kRed[] = "\x1b[1;31m";
constexpr char kYellow[] = "\x1b[1;33m";
constexpr char kGreen[] = "\x1b[1;32m";
constexpr char kCyan[] = "\x1b[1;36m";
constexpr char kPlain[] = "\x1b[0m";

bool isSet(const char* variable) {
  const char* const value = std::getenv(variable);
  return value != nullptr && *value != '\0';
}

bool showsColors() {
  const char* const terminal = std::getenv("TERM");
  const bool isDumb = terminal != nullptr && std::string_view(terminal) == "dumb";
  return platform::isTerminal(stderr) && !isDumb && !isSet("NO_COLOR");
}

Color chosenColor = Color::kAuto;
std::FILE* report = stdout;

bool isColored() { return chosenColor == Color::kAuto ? showsColors() : chosenColor == Color::kAlways; }

// Colours `length` characters of the text from `first` on; returns the index behind them.
std::size_t paint(std::string& text, std::size_t first, std::size_t length, const char* color) {
  text.insert(first + length, kPlain).insert(first, color);
  return first + length + std::strlen(color) + std::strlen(kPlain);
}

// Colours the first "error:" or "warning:" behind `from`, where the text has one; returns the index behind it.
std::size_t paintSeverity(std::string& text, std::size_t from) {
  const std::size_t error = text.find("error: ", from);
  const std::size_t warning = text.find("warning: ", from);
  if (error < warning) return paint(text, error, std::strlen("error:"), kRed);
  return warning == std::string::npos ? from : paint(text, warning, std::strlen("warning:"), kYellow);
}

std::size_t skipLine(const std::string& text, std::size_t from) {
  return std::min(text.find('\n', from), text.size() - 1) + 1;
}

std::size_t paintUnderline(std::string& text, std::size_t from) {
  const std::size_t caret = text.find('^', from);
  return caret == std::string::npos ? from : paint(text, caret, text.find('\n', caret) - caret, kGreen);
}

// A related place behind `from`: its "note:", and what is under the line of the script.
std::size_t paintNote(std::string& text, std::size_t from) {
  const std::size_t note = text.find(" note: ", from);
  if (note == std::string::npos) return from;
  const std::size_t painted = paint(text, note + 1, std::strlen("note:"), kCyan);
  return paintUnderline(text, skipLine(text, skipLine(text, painted)));
}

std::string paintDiagnostic(std::string text, const Diagnostic& diagnostic, const ScriptFile& file) {
  std::size_t painted = paintSeverity(text, toPrintable(file.name()).size());
  for (int line = 0; line < 2; ++line) painted = skipLine(text, painted);  // the message, the line of the script
  if (diagnostic.place.isKnown()) painted = paintUnderline(text, painted);
  for (std::size_t i = 0; i < diagnostic.related.size(); ++i) painted = paintNote(text, painted);
  return text;
}

void failOutput() {
  if (platform::wasPipeClosed()) return;
  throw Refusal(std::string("the standard output cannot be written: ") + std::strerror(errno));
}

}  // namespace

void setColor(Color color) { chosenColor = color; }

void leaveOutputToData() { report = stderr; }

void print(std::string_view text) {
  if (std::fwrite(text.data(), 1, text.size(), report) != text.size()) failOutput();
}

void flushOutput() {
  if (std::fflush(stdout) != 0) failOutput();
}

void printError(std::string_view text) {
  std::fflush(stdout);
  std::string shown(text);
  if (isColored() && text.starts_with("ktorba: ")) paintSeverity(shown, 0);
  std::fwrite(shown.data(), 1, shown.size(), stderr);
  std::fflush(stderr);  // some systems hold it back, and then what is printed later comes first
}

void printFailure(const std::string& message, const std::string& help) {
  std::string text = "ktorba: error: " + toPrintable(message) + "\n";
  if (!help.empty()) text += "  " + toPrintable(help) + "\n";
  printError(text);
}

void printFailure(const Refusal& refusal) { printFailure(refusal.what(), withOption(refusal.help, refusal.setting)); }

void printDiagnostic(const Diagnostic& diagnostic, const ScriptFile& file) {
  Diagnostic shown = diagnostic;
  shown.help = withOption(diagnostic.help, diagnostic.setting);
  const int columns = platform::isTerminal(stderr) ? platform::terminalColumns(stderr) : kUsualColumns;
  const std::string text = formatDiagnostic(shown, file, columns);
  printError(isColored() ? paintDiagnostic(text, diagnostic, file) : text);
}

std::string withOption(const std::string& help, Setting setting) {
  for (const OptionOfSetting& row : kOptions) {
    if (row.setting == setting) return help + (help.empty() ? "" : " ") + "The option is " + row.option + ".";
  }
  return help;
}

// The last column stays free: a terminal may begin a line behind it.
std::string progressLine(std::string_view label, int percent, int columns) {
  const std::string number = std::to_string(percent) + " %";
  const int room = columns - 1 - static_cast<int>(number.size());
  if (room < kShortestLabel + 1) return cutToWidth(number, columns - 1);
  const std::string shown = cutToWidth(toPrintable(label), std::max(kShortestLabel, room - 1 - kWidestBar - 1));
  const int width = std::min(kWidestBar, room - 1 - 1 - static_cast<int>(blanksFor(shown).size()));
  if (width < kNarrowestBar) return shown + " " + number;
  std::string bar;
  for (int i = 0; i < width; ++i) bar += i < percent * width / 100 ? "\u2588" : "\u2591";
  return shown + " " + bar + " " + number;
}

ProgressBar::ProgressBar(std::string label)
    : label_(std::move(label)),
      isTerminal_(platform::isTerminal(stderr)),
      startMs_(platform::monotonicMilliseconds()) {}

ProgressBar::~ProgressBar() {
  if (isDrawn_) printError("\r\x1b[K");
}

void ProgressBar::show(double fraction) {
  const int percent = static_cast<int>(fraction * 100);
  if (!isTerminal_ || percent == shownPercent_ || platform::monotonicMilliseconds() - startMs_ < kShownAfterMs) return;
  shownPercent_ = percent;
  isDrawn_ = true;
  printError("\r" + progressLine(label_, percent, platform::terminalColumns(stderr)) + "\x1b[K");
}

}  // namespace tools::cli
