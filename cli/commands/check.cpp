#include <algorithm>

#include "cli/commands/commands.h"
#include "cli/console.h"
#include "tools/check/checkText.h"
#include "tools/diagnostics/json.h"
#include "tools/outputs/OutputFile.h"
#include "tools/player/simulatedGenerator.h"
#include "tools/text/Refusal.h"
#include "tools/text/characters.h"

namespace tools::cli {
namespace {

struct Findings {
  std::vector<FileDiagnostics> files;
  bool hasErrors = false;
};

std::string plural(std::size_t count, const char* word) {
  return std::to_string(count) + " " + word + (count == 1 ? "" : "s");
}

void report(const ScriptFile& file, std::size_t scripts, const std::vector<Diagnostic>& found) {
  for (const Diagnostic& diagnostic : found) printDiagnostic(diagnostic, file);
  if (found.size() >= kMaxErrors)
    printError("ktorba: " + toPrintable(file.name()) + ": there are more; mend these first\n");
  if (scripts > 0) print(toPrintable(file.name()) + ": " + plural(scripts, "script") + ", no errors\n");
}

// Puts what leaves no doubt into the file.
void applyFixes(const ScriptFile& file, const std::string& path, const std::vector<Diagnostic>& found) {
  const auto [text, count] = applyCertainFixes(file.text(), found);
  if (count == 0) return;
  OutputFile mended(path);
  if (file.hasByteOrderMark()) mended.write(kByteOrderMark.data(), kByteOrderMark.size());
  mended.write(text.data(), text.size());
  mended.commit();
  printError("ktorba: " + toPrintable(path) + ": " + std::to_string(count) + (count == 1 ? " fix" : " fixes") +
             " applied; check it again\n");
}

void checkFile(const std::string& path, const CheckOptions& options, Findings& findings) {
  const auto file = std::make_shared<ScriptFile>(ScriptFile::read(path));
  auto [scripts, found] = checkText(*file, toScriptTraits(options.generator), options.generator.sampleRateHz);
  if (scripts == 0 || (options.isStrict && !found.empty())) findings.hasErrors = true;
  if (!options.isJson) report(*file, scripts, found);
  if (options.isFixing) applyFixes(*file, path, found);
  findings.files.push_back({path, file, std::move(found)});
}

// A file that cannot be read is one more error, so that the others are still checked.
void noteUnreadable(const Refusal& error, const std::string& path, const CheckOptions& options, Findings& findings) {
  findings.hasErrors = true;
  if (!options.isJson) printFailure(error);
  findings.files.push_back({path, nullptr, {{.message = error.what()}}});
}

}  // namespace

int check(const CheckOptions& options) {
  checkOptions(options.generator);
  if (options.isFixing && std::ranges::find(options.scripts, "-") != options.scripts.end()) {
    throw Refusal("the standard input cannot be fixed", "Give the script as a file.");
  }
  Findings findings;
  for (const std::string& path : options.scripts) {
    try {
      checkFile(path, options, findings);
    } catch (const Refusal& error) {
      noteUnreadable(error, path, options, findings);
    }
  }
  if (options.isJson) print(formatDiagnosticsAsJson(findings.files));
  return findings.hasErrors ? kFailure : kSuccess;
}

}  // namespace tools::cli
