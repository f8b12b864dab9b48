#include <gmock/gmock.h>

#include "testing/files.h"
#include "tests/tools/sourceOutcome.h"
#include "tools/sources/RawFile.h"
#include "tools/text/Refusal.h"

namespace tools {
namespace {

using testing::HasSubstr;

TEST(Source, ShapesFollowTheirParameters) {
  using V = std::vector<std::int32_t>;
  const std::pair<const char*, V> cases[] = {
      {"sine:length=4", {0, 32767, 0, -32768}},
      {"sine:length=4us,frequency=250kHz,phase=90deg,amplitude=0.5,offset=0.25", {24576, 8192, -8192, 8192}},
      {"sine:length=2,cycles=0,phase=1.5707963267948966rad,amplitude=0.5", {16384, 16384}},
      {"square:length=4,cycles=1,duty=0.25,amplitude=0.5", {16384, -16384, -16384, -16384}},
      {"ramp:length=4", {-32768, -16384, 0, 16384}},
      {"triangle:length=8", {0, 16384, 32767, 16384, 0, -16384, -32768, -16384}},
      {"gauss:length=3,sigma=1,amplitude=0.5", {9937, 16384, 9937}},
      {"dc:length=2,amplitude=-1", {-32768, -32768}},
      {"chirp:length=3,from=0Hz,to=0", {0, 0, 0}},
      {"noise:length=1,seed=5489", {18797}},
  };
  for (const auto& [source, expected] : cases) EXPECT_EQ(load(source), expected) << source;
  EXPECT_EQ(load("dc:length=2", k32), (V{2147483647, 2147483647}));
  EXPECT_EQ(loadSource("sine", k16).samples.size(), 1000u);
  EXPECT_EQ(loadSource("dc:length=3,amplitude=1.001", k16).clippedSamples, 3u);
  EXPECT_EQ(loadSource("dc:length=3,amplitude=1", k16).clippedSamples, 0u);
}

TEST(Source, RawFilesGiveTheirSamplesBitForBit) {
  const TemporaryFolder folder;
  using V = std::vector<std::int32_t>;
  const std::string raw = folder.write("r.raw", std::string("\x01\x00\xFF\xFF", 4));
  EXPECT_EQ(load(raw), (V{1, -1}));
  EXPECT_EQ(load(raw, k32), (V{-65535}));
  EXPECT_EQ(load(raw + ":gain=2,offset=0.5"), (V{16386, 16382}));
  EXPECT_EQ(load(raw + ":normalise"), (V{32767, -32768}));
  Parameters none("r.raw");
  EXPECT_THAT([&] { loadRawSamples(folder.path(""), none, k16); },
              testing::ThrowsMessage<Refusal>(HasSubstr("r.raw: cannot be")));
}

TEST(Source, NamesStandInFront) {
  EXPECT_THROW(parseNamedSource("pulse"), Refusal);
  EXPECT_EQ(parseNamedSource("p=sine:length=5").source, "sine:length=5");
}

}  // namespace
}  // namespace tools
