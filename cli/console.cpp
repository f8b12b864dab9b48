#include "cli/console.h"

#include <cerrno>
#include <cstdio>
#include <cstring>

#include "platform/system/clock.h"
#include "platform/system/terminal.h"
#include "tools/text/characters.h"

namespace tools::cli {
namespace {

constexpr std::uint64_t kShownAfterMs = 500;
constexpr int kBarWidth = 40;

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
};

void failOutput() {
  if (platform::wasPipeClosed()) return;
  throw Refusal(std::string("the standard output cannot be written: ") + std::strerror(errno));
}

}  // namespace

void print(std::string_view text) {
  if (std::fwrite(text.data(), 1, text.size(), stdout) != text.size()) failOutput();
}

void flushOutput() {
  if (std::fflush(stdout) != 0) failOutput();
}

void printError(std::string_view text) {
  std::fflush(stdout);
  std::fwrite(text.data(), 1, text.size(), stderr);
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
  printError(formatDiagnostic(shown, file));
}

std::string withOption(const std::string& help, Setting setting) {
  for (const OptionOfSetting& row : kOptions) {
    if (row.setting == setting) return help + (help.empty() ? "" : " ") + "The option is " + row.option + ".";
  }
  return help;
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
  const int filled = percent * kBarWidth / 100;
  std::string bar;
  for (int i = 0; i < kBarWidth; ++i) bar += i < filled ? "\u2588" : "\u2591";
  printError("\r" + label_ + " " + bar + " " + std::to_string(percent) + " %");
}

}  // namespace tools::cli
