#include "cli/commands/commands.h"
#include "cli/console.h"
#include "tools/diagnostics/json.h"
#include "tools/player/simulatedGenerator.h"
#include "tools/program/ProgramBuilder.h"
#include "tools/check/checkText.h"
#include "tools/check/warnings.h"
#include "tools/text/Refusal.h"
#include "tools/text/characters.h"

namespace tools::cli {
namespace {

struct Findings {
  std::vector<Diagnostic> diagnostics;
  std::vector<std::string> files;  // of each diagnostic
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

void checkFile(const std::string& path, const CheckOptions& options, Findings& findings) {
  const ScriptFile file = ScriptFile::read(path);
  std::vector<Diagnostic> found;
  const std::size_t scripts = ProgramBuilder(options.generator).compile(file, found);
  if (scripts > 0) findWarnings(file, toScriptTraits(options.generator), found);
  if (scripts == 0 || (options.isStrict && !found.empty())) findings.hasErrors = true;
  if (!options.isJson) report(file, scripts, found);
  findings.files.insert(findings.files.end(), found.size(), path);
  findings.diagnostics.insert(findings.diagnostics.end(), found.begin(), found.end());
}

// A file that cannot be read is one more error, so that the others are still checked.
void noteUnreadable(const Refusal& error, const std::string& path, const CheckOptions& options, Findings& findings) {
  findings.hasErrors = true;
  if (!options.isJson) printFailure(error);
  findings.diagnostics.push_back({.message = error.what()});
  findings.files.push_back(path);
}

}  // namespace

int check(const CheckOptions& options) {
  checkOptions(options.generator);
  Findings findings;
  for (const std::string& path : options.scripts) {
    try {
      checkFile(path, options, findings);
    } catch (const Refusal& error) {
      noteUnreadable(error, path, options, findings);
    }
  }
  if (options.isJson) print(formatDiagnosticsAsJson(findings.diagnostics, findings.files));
  return findings.hasErrors ? kFailure : kSuccess;
}

}  // namespace tools::cli
