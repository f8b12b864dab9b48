// Archives of arrays as sources.
#include <gmock/gmock.h>
#include <zip.h>

#include "testing/files.h"
#include "tests/tools/sourceOutcome.h"

namespace tools {
namespace {

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
