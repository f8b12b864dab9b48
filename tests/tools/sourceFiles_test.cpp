// Files as sources, in tables: what of their bytes was taken, said or refused.
#include <gmock/gmock.h>
#include <zip.h>

#include <sstream>

#include "testing/files.h"
#include "testing/golden.h"
#include "tools/sources/Source.h"
#include "tools/text/Refusal.h"
#include "tools/text/words.h"

namespace tools {
namespace {

constexpr SourceFormat k16 = {16, 1e6, 1u << 20};

// "\n", "\x93" and the like as the bytes that they stand for.
std::string unescape(std::string_view text) {
  std::string bytes;
  for (std::size_t i = 0; i < text.size(); ++i) {
    if (text[i] != '\\') {
      bytes += text[i];
    } else if (text[++i] == 'x') {
      bytes += static_cast<char>(*parseInteger<int>(text.substr(i + 1, 2), 16));
      i += 2;
    } else {
      bytes += text[i] == 'n' ? '\n' : text[i] == 'r' ? '\r' : '\t';
    }
  }
  return bytes;
}

// "v1 HEADER | BYTES" as an array file; anything else as it is.
std::string unescapeArray(const std::string& text) {
  const std::size_t end = text.find(" | ");
  if (!text.starts_with('v') || end == std::string::npos) return unescape(text);
  const char version = static_cast<char>(text[1] - '0');
  const std::string header = text.substr(3, end - 3);
  const std::string length = {static_cast<char>(header.size()), 0};
  return "\x93NUMPY" + std::string{version, 0} + length + std::string(version == 1 ? 0 : 2, '\0') + header +
         unescape(text.substr(end + 3));
}

// The notes and the first samples, or the refusal and its help.
std::string outcome(const std::string& source, const std::string& path) {
  std::string text;
  try {
    const LoadedWaveform waveform = loadSource(source, k16);
    text = join(waveform.notes, "; ") + " =";
    for (std::size_t i = 0; i < waveform.samples.size(); ++i) text += " " + std::to_string(waveform.samples[i]);
    if (waveform.clippedSamples > 0) text += ", clipped " + std::to_string(waveform.clippedSamples);
  } catch (const Refusal& refusal) {
    text = std::string(refusal.what()) + (refusal.help.empty() ? "" : " / ") + refusal.help;
  }
  for (std::size_t i = text.find(path); i != std::string::npos; i = text.find(path))
    text.replace(i, path.size(), "FILE");
  return text;
}

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

std::string writeArchive(const std::string& path, const std::vector<std::pair<std::string, std::string>>& members) {
  zip_t* archive = zip_open(path.c_str(), ZIP_CREATE | ZIP_TRUNCATE, nullptr);
  for (const auto& [name, bytes] : members) {
    const zip_int64_t index =
        zip_file_add(archive, name.c_str(), zip_source_buffer(archive, bytes.data(), bytes.size(), 0), 0);
    zip_set_file_compression(archive, static_cast<zip_uint64_t>(index), ZIP_CM_STORE, 0);
  }
  zip_close(archive);
  return path;
}

TEST(SourceFiles, Archives) {
  const TemporaryFolder folder;
  const std::string a =
      unescapeArray("v1 {'descr': '<i2', 'fortran_order': False, 'shape': (2, 1)} | \\x01\\x00\\x02\\x00");
  const std::string b = unescapeArray("v1 {'descr': '<i2', 'fortran_order': False, 'shape': (1,)} | \\x05\\x00");
  const std::string one = writeArchive(folder.path("1.npz"), {{"a.npy", a}});
  const std::string two = writeArchive(folder.path("2.npz"), {{"wave.npy", a}, {"b, c.npy", b}});
  std::string damaged = folder.read("1.npz");
  damaged.at(damaged.find(std::string("\x01\x00\x02", 3), 60)) ^= 8;
  const std::pair<std::string, const char*> cases[] = {
      {one, "array \"a\", column 1 of 2 × 1, int16 as sample codes, 2 samples, 1 to 2 = 1 2"},
      {two, "holds several arrays, and which is meant is not said / It holds wave, b, c."},
      {two + ":wave,column=1", "= 1 2"},
      {two + ":wave.npy,gain=2", "= 2 4"},
      {two + ":b, c", "= 5"},
      {two + ":wvae", "there is no array \"wvae\" / A similar array: `wave`."},
      {folder.write("damaged.npz", damaged), "damaged.npz: CRC error"},
      {folder.write("cut.npz", damaged.substr(0, damaged.size() / 2)), "cut.npz: "},
  };
  for (const auto& [source, expected] : cases) EXPECT_THAT(outcome(source, "-"), testing::HasSubstr(expected));
}

}  // namespace
}  // namespace tools
