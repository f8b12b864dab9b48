// Script texts beside what they compile to: a listing, every line with its place in the text, or an error. In the texts
// \r, \t, \\ and \xNN stand for bytes that a text file shows badly.
#include "testing/golden.h"

#include <gtest/gtest.h>

#include <sstream>

#include "ScriptTest.h"
#include "ktWfmScriptCompiler/printScript.h"

namespace ktwfmscriptcompiler {
namespace {

std::string unescape(const std::string& text) {
  std::string bytes;
  for (std::size_t i = 0; i < text.size(); ++i) {
    if (text[i] != '\\') {
      bytes += text[i];
    } else if (text[++i] == 'x') {
      bytes += static_cast<char>(std::stoi(text.substr(i + 1, 2), nullptr, 16));
      i += 2;
    } else {
      bytes += text[i] == 'r' ? '\r' : text[i] == 't' ? '\t' : '\\';
    }
  }
  return bytes;
}

// The listing with every line's place in the text.
std::string annotated(const std::string& listing, const ScriptPlaces& script) {
  std::istringstream lines(listing);
  std::string text, line;
  const auto add = [&](const SourcePlace& place) {
    std::getline(lines, line);
    text += line + "  @" + std::to_string(place.start.line) + ":" + std::to_string(place.start.positionInLine) + "\n";
  };
  add(script.script);
  for (const BlockPlaces& block : script.blocks) {
    add(block.block);
    for (const SourcePlace& fetch : block.fetches) add(fetch);
  }
  return text + (std::getline(lines, line) ? "more lines than places\n" : "");
}

std::string compileToText(const std::string& text) {
  try {
    SourceMap map;
    const std::vector<CompiledScript> scripts = compile(text, testTraits(), &map);
    std::string listing;
    for (std::size_t i = 0; i < scripts.size(); ++i) listing += annotated(printScript(scripts[i]), map.at(i));
    return listing;
  } catch (const kterr::Exception& failure) {
    return std::to_string(failure.code()) + " " + describe(failure.what()) + "\n";
  }
}

class Golden : public testing::TestWithParam<std::filesystem::path> {};

TEST_P(Golden, CompilesAsWritten) {
  GoldenFile(GetParam()).check([](auto& text) { return compileToText(unescape(text)); });
}

INSTANTIATE_TEST_SUITE_P(Files, Golden, testing::ValuesIn(goldenFiles(KTORBA_GOLDEN_FOLDER)), goldenName);

}  // namespace
}  // namespace ktwfmscriptcompiler
