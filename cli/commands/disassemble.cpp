#include <algorithm>
#include <array>

#include "cli/JsonWriter.h"
#include "cli/LoadedScript.h"
#include "cli/commands/commands.h"
#include "cli/console.h"
#include "ktWfmScriptCompiler/compile.h"
#include "ktWfmScriptCompiler/printScript.h"
#include "ktcheckname/compareNames.h"
#include "tools/program/listing.h"
#include "tools/text/characters.h"
#include "tools/text/quantities.h"
#include "tools/timeline/describeLength.h"

namespace tools::cli {
namespace {

constexpr std::size_t kMeaningWidth = 44;

std::string padRight(std::string text, std::size_t width) {
  if (text.size() < width) text.append(width - text.size(), ' ');
  return text;
}

std::string padLeft(const std::string& text, std::size_t width) {
  return std::string(width - std::min(width, text.size()), ' ') + text;
}

std::string hexadecimal(std::uint32_t word) {
  std::string text(8, '0');
  for (std::size_t i = 8; word != 0; word /= 16) text[--i] = "0123456789abcdef"[word % 16];
  return text;
}

class Disassembly {
 public:
  Disassembly(const LoadedScript& loaded, const Program& program, double sampleRateHz)
      : loaded_(loaded), program_(program), sampleRateHz_(sampleRateHz) {}

  void printListing() {
    print("script " + program_.entry.script.name + "\n");
    for (std::size_t address = 0; address < program_.origins.size(); ++address) {
      printSourceLine(program_.places[address].line);
      printInstruction(address);
    }
    printTotals();
  }

 private:
  void printSourceLine(std::uint32_t line) {
    if (line == shownLine_) return;
    shownLine_ = line;
    print(padLeft(std::to_string(line), 7) + " | " + toPrintable(loaded_.file.line(line)) + "\n");
  }

  void printInstruction(std::size_t address) const {
    std::string text = padLeft(std::to_string(address), 5) + "  ";
    for (const std::uint32_t word : program_.entry.instructionWords[address].words) text += hexadecimal(word) + " ";
    const ListedInstruction listed = listInstruction(program_, address, loaded_.builder);
    text += " " + padRight(toPrintable(listed.meaning), kMeaningWidth);
    if (listed.memoryWords > 0) {
      text += padLeft(std::to_string(listed.memoryWords), 8) + (listed.memoryWords == 1 ? " word   " : " words  ") +
              formatQuantity(static_cast<double>(listed.samples) / sampleRateHz_, "s");
    }
    print(text.substr(0, text.find_last_not_of(' ') + 1) + "\n");
  }

  void printTotals() const {
    const ktorba::ScriptEntry& entry = program_.entry;
    print("  = " + formatCount(entry.instructionWords.size()) + " of " +
          formatCount(loaded_.builder.traits().sequenceMemoryWords) + " instructions, " +
          formatCount(entry.totalMemoryWords) + " memory words" +
          (entry.isEndless || entry.hasUnboundedLoop ? " in one pass" : "") + ", " +
          describeLength(lengthOf(program_, loaded_.builder), program_, sampleRateHz_) + "\n");
  }

  const LoadedScript& loaded_;
  const Program& program_;
  double sampleRateHz_;
  std::uint32_t shownLine_ = 0;
};

bool isWanted(const DisassembleOptions& options, const std::string& name) {
  return options.name.empty() || ktcheckname::compareNames(options.name, name) == 0;
}

void printAsScripts(const LoadedScript& loaded, const DisassembleOptions& options) {
  const auto traits = toScriptTraits(options.generator);
  for (const auto& script : ktwfmscriptcompiler::compile(loaded.file.text(), traits)) {
    if (isWanted(options, script.name)) print(ktwfmscriptcompiler::printAsScript(script, traits));
  }
}

void printListings(const LoadedScript& loaded, const DisassembleOptions& options) {
  const char* separator = "";
  for (const Program& program : loaded.programs) {
    if (!isWanted(options, program.entry.script.name)) continue;
    print(separator);
    Disassembly(loaded, program, options.generator.sampleRateHz).printListing();
    separator = "\n";
  }
}

void addInstruction(JsonWriter& json, const LoadedScript& loaded, const Program& program, std::size_t address) {
  const ListedInstruction listed = listInstruction(program, address, loaded.builder);
  json.openObject();
  json.add("address", address);
  json.openArray("words", JsonWriter::Shape::kFlat);
  for (const std::uint32_t word : program.entry.instructionWords[address].words) json.add({}, hexadecimal(word));
  json.close();
  json.add("meaning", listed.meaning);
  json.add("line", program.places[address].line);
  json.add("memoryWords", listed.memoryWords);
  json.add("samples", listed.samples);
  json.close();
}

void addScript(JsonWriter& json, const LoadedScript& loaded, const Program& program) {
  json.openObject({}, JsonWriter::Shape::kTall);
  json.add("name", program.entry.script.name);
  json.add("memoryWords", program.entry.totalMemoryWords);
  json.add("samples", lengthOf(program, loaded.builder).samples());
  json.openArray("instructions");
  for (std::size_t address = 0; address < program.origins.size(); ++address) {
    addInstruction(json, loaded, program, address);
  }
  json.close();
  json.close();
}

void printAsJson(const LoadedScript& loaded, const DisassembleOptions& options) {
  JsonWriter json("disassemble");
  json.add("file", loaded.file.name());
  json.openArray("scripts");
  for (const Program& program : loaded.programs) {
    if (isWanted(options, program.entry.script.name)) addScript(json, loaded, program);
  }
  json.close();
  json.finish();
}

}  // namespace

int disassemble(const DisassembleOptions& options) {
  const auto loaded =
      loadScript(options.script, options.waveforms, options.generator, options.generator.memorySamples());
  if (!loaded || !buildPrograms(*loaded)) return kFailure;
  if (!options.name.empty()) findProgram(*loaded, options.name);
  const auto printAs = options.isJson ? printAsJson : options.asScript ? printAsScripts : printListings;
  printAs(*loaded, options);
  return kSuccess;
}

}  // namespace tools::cli
