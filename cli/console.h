// The tool's standard output and error stream. One thread at a time.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "tools/diagnostics/Diagnostic.h"
#include "tools/text/Refusal.h"

namespace tools::cli {

// Whether messages on standard error are coloured. `kAuto`: where it is a terminal that shows colours, and NO_COLOR is
// not set.
enum class Color { kAuto, kAlways, kNever };
void setColor(Color color);

// From now on print() goes to standard error, since the standard output carries data.
void leaveOutputToData();

// To standard output. Throws Refusal when it cannot be written, for want of room say. Once nobody reads it any more,
// what is printed is dropped: the command goes on to its end, since its exit code still counts.
void print(std::string_view text);
void flushOutput();

// To standard error; failures are ignored, since there is nobody to tell them to.
void printError(std::string_view text);

// "ktorba: error: ..." and, when there is any, the help.
void printFailure(const std::string& message, const std::string& help);
void printFailure(const Refusal& refusal);

// Shows a diagnostic on standard error.
void printDiagnostic(const Diagnostic& diagnostic, const ScriptFile& file);

// `help` with a sentence behind it on the option that changes the setting.
std::string withOption(const std::string& help, Setting setting);

// "playing ████░░░░ 50 %" in less than that many columns: the label is cut first, then the bar goes.
std::string progressLine(std::string_view label, int percent, int columns);

// A bar on standard error for work that takes long; draws nothing where that is no terminal. The bar is removed by
// its destructor.
class ProgressBar {
 public:
  explicit ProgressBar(std::string label);
  ~ProgressBar();
  ProgressBar(const ProgressBar&) = delete;
  ProgressBar& operator=(const ProgressBar&) = delete;

  void show(double fraction);  // 0 to 1

 private:
  std::string label_;
  bool isTerminal_;
  bool isDrawn_ = false;
  std::uint64_t startMs_;
  int shownPercent_ = -1;
};

}  // namespace tools::cli
