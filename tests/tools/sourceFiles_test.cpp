// Files as sources, in tables: what of their bytes was taken, said or refused.
#include <gmock/gmock.h>

#include <sstream>

#include "testing/files.h"
#include "testing/golden.h"
#include "tests/tools/sourceOutcome.h"

namespace tools {
namespace {

// Plays a table again: a line with " | " is a file, one that stands in by two blanks what came of it.
void checkTable(const std::string& name, const std::string& fileName, std::string (*toBytes)(const std::string&)) {
  const TemporaryFolder folder;
  const std::string path = std::string(KTORBA_TABLES) + "/" + name;
  std::istringstream table(readFile(path));
  std::string replayed;
  for (std::string line; std::getline(table, line);) {
    if (line.starts_with("  ")) continue;
    replayed += line + "\n";
    const std::size_t bar = line.find(" | ");
    if (bar == std::string::npos || line.starts_with('#')) continue;
    const std::string file = folder.write(fileName, toBytes(line.substr(bar + 3)));
    replayed += "  " + outcome(file + unescape(line.substr(0, bar)), file) + "\n";
  }
  expectGolden(path, replayed);
}

TEST(SourceFiles, TablesOfText) {
  checkTable("tables.txt", "t.csv", [](const std::string& text) { return unescape(text); });
}

TEST(SourceFiles, Arrays) { checkTable("arrays.txt", "a.npy", unescapeArray); }

std::string toUtf16(const std::string& text) {
  std::string bytes = "\xFF\xFE";
  for (const char c : text) bytes.append({c, 0});
  return bytes;
}

TEST(SourceFiles, LongTablesAreReadWholeAndLongRowsAreNot) {
  const TemporaryFolder folder;
  std::string text = "no;code\r\n";
  for (int i = 0; i < 200000; ++i) text += std::to_string(i) + ";" + std::to_string(i % 30000) + "\r\n";
  for (const std::string& bytes : {text, toUtf16(text)}) {
    const LoadedWaveform waveform = loadSource(folder.write("long.csv", bytes) + ":code,codes", k16);
    ASSERT_EQ(waveform.samples.size(), 200000u);
    for (int i = 0; i < 200000; ++i) ASSERT_EQ(waveform.samples[static_cast<std::size_t>(i)], i % 30000) << i;
  }
  const std::string row = folder.write("row.csv", "1\n" + std::string(3 << 20, '2'));
  EXPECT_THAT(outcome(row, "-"), testing::HasSubstr("row 2 is longer than a mebibyte"));
}

}  // namespace
}  // namespace tools
