// Prints docs/messages.md: every kind of message with its example and what is said of it, from the table of them. Fails
// when an example is answered by another kind.
#include <algorithm>
#include <iostream>
#include <string>

#include "kterr/hexText.h"
#include "tools/check/checkText.h"
#include "tools/check/foreignWords.h"
#include "tools/check/lookalikes.h"
#include "tools/program/ProgramBuilder.h"
#include "tools/text/characters.h"

namespace tools {
namespace {

constexpr char kOpening[] = R"(# Messages

What the tool says of a script, kind by kind, each with a script and the answer. A headline tells what is wrong in the
words of the script, the line below what would be right, and the last one the library's constant and code, which
[errors.md](errors.md) lists. `tools/diagnostics/messages.def` is the table behind it: after a change to it, write this
page anew with `ktorba_describe_messages`.
)";

struct Generator {
  std::uint32_t alignmentQuantum;
  std::uint32_t minFetchSamples;
  const char* remark;
};

// The tool's own first; the others are for faults that it does not have.
constexpr Generator kGenerators[] = {
    {1, 64, ""},
    {8, 64, "On a generator whose lengths and positions are multiples of 8:\n\n"},
    {1, 200, "On a generator that plays at least 200 samples at a time:\n\n"},
};

struct Example {
  MessageKind kind;
  std::string_view headline;
  std::string_view script;
};

Diagnostic* findKind(std::vector<Diagnostic>& diagnostics, MessageKind kind) {
  const auto found = std::ranges::find(diagnostics, kind, &Diagnostic::kind);
  return found == diagnostics.end() ? nullptr : &*found;
}

// What a tool without the waveforms says, else what one with them does.
std::vector<Diagnostic> answer(const ScriptFile& file, const Generator& generator) {
  GeneratorOptions options;
  options.minFetchSamples = generator.minFetchSamples;
  ktwfmscriptcompiler::ScriptTraits traits = toScriptTraits(options);
  traits.alignmentQuantum = generator.alignmentQuantum;
  auto diagnostics = checkText(file, traits, options.sampleRateHz).diagnostics;
  if (!diagnostics.empty()) return diagnostics;
  ProgramBuilder builder(options);
  builder.compile(file, diagnostics);
  builder.checkWaveformsAreThere({"pulse"}, {"pulse"}, diagnostics);
  builder.addWaveform("pulse", 1000);
  if (diagnostics.empty()) builder.build(diagnostics);
  return diagnostics;
}

void printBlock(const std::string& text) {
  std::cout << "```\n" << text << (text.ends_with('\n') ? "" : "\n") << "```\n";
}

std::string printableLines(const ScriptFile& file) {
  std::string text;
  for (std::uint32_t line = 1; file.offsetOf({line, 1}) < file.text().size(); ++line) {
    text += toPrintable(file.line(line)) + "\n";
  }
  return text;
}

// "a marker at {0}" becomes "a marker at ...".
std::string titleOf(std::string_view headline) {
  std::string title;
  for (std::size_t i = 0; i < headline.size(); ++i) {
    const bool isValue = headline[i] == '{' && headline.substr(i).size() > 2 && headline[i + 2] == '}';
    title += isValue ? "..." : std::string(1, headline[i]);
    if (isValue) i += 2;
  }
  return title;
}

bool printExample(const Example& example) {
  const ScriptFile file("s.kts", std::string(example.script));
  for (const Generator& generator : kGenerators) {
    std::vector<Diagnostic> diagnostics = answer(file, generator);
    const Diagnostic* const found = findKind(diagnostics, example.kind);
    if (found == nullptr) continue;
    std::cout << "\n### " << titleOf(example.headline) << "\n\n";
    std::cout << generator.remark;
    if (!example.script.empty()) printBlock(printableLines(file));
    printBlock(formatDiagnostic(*found, file));
    return true;
  }
  std::cerr << "the example of \"" << example.headline << "\" is answered otherwise:\n" << example.script << "\n";
  for (const Diagnostic& other : answer(file, kGenerators[0])) std::cerr << formatDiagnostic(other, file);
  return false;
}

void printGroup(const char* title, const char* text) { std::cout << "\n## " << title << "\n\n" << text << "\n"; }

void printTables() {
  printGroup("Words of other languages", "What is said of each where an instruction is expected.");
  std::cout << "\n| word | how it is done here |\n|---|---|\n";
  for (const ForeignWord& word : allForeignWords()) std::cout << "| `" << word.word << "` | " << word.help << " |\n";
  printGroup("Characters that look like others, or like nothing", "What is said of each, wherever it stands.");
  std::cout << "\n| code point | name | what to do |\n|---|---|---|\n";
  for (const Lookalike& lookalike : allLookalikes()) {
    std::cout << "| U+" << kterr::hexText(lookalike.codePoint, 4).substr(2) << " | " << lookalike.name << " | "
              << adviceOn(lookalike) << " |\n";
  }
}

// False when an example is answered otherwise.
bool printPage() {
  bool isGood = true;
  std::cout << kOpening;
#define KTORBA_MESSAGE_GROUP(title, text) printGroup(title, text);
#define KTORBA_MESSAGE(name, headline, help, example) \
  isGood &= printExample({MessageKind::name, headline, {example, sizeof(example) - 1}});
#include "tools/diagnostics/messages.def"
#undef KTORBA_MESSAGE
#undef KTORBA_MESSAGE_GROUP
  printTables();
  return isGood;
}

}  // namespace
}  // namespace tools

int main() { return tools::printPage() ? 0 : 1; }
