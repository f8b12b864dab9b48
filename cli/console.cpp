#include "cli/console.h"

#include <cerrno>
#include <cstdio>
#include <cstring>

#include "cli/UserError.h"
#include "cli/diagnostics/Diagnostic.h"
#include "platform/system/clock.h"
#include "platform/system/terminal.h"

namespace cli {
namespace {

constexpr std::uint64_t kShownAfterMs = 500;
constexpr int kBarWidth = 40;

void failOutput() {
  if (platform::wasPipeClosed()) return;
  throw UserError(std::string("the standard output cannot be written: ") + std::strerror(errno));
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

}  // namespace cli
