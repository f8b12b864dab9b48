#include "ktorba/waveform/WaveformTable.h"

#include <gmock/gmock.h>

#include "ktorba/waveform/ScopeExitCleanupOperation.h"
#include "testing/caught.h"

namespace ktorba {
namespace {

using testing::HasSubstr;

TEST(WaveformTable, KnowsNamesInAnyLetterCase) {
  WaveformTable<WaveformEntry> table;
  WaveformEntry& added = table.addWaveform("wave1", 100);
  added.memoryOffset = 64;
  EXPECT_TRUE(table.containsWaveform("WAVE1"));
  EXPECT_EQ(&table.getWaveform("Wave1"), &added);
  EXPECT_EQ(table.getWaveform("WAVE1").name, "wave1");
  EXPECT_THAT(failureOf([&] { table.addWaveform("Wave1", 7); }),
              AllOf(HasSubstr("-1074097977"), HasSubstr(R"(includes\\ktorba/waveform/WaveformTable)"),
                    HasSubstr(R"("kUsageTypeWaveformName","value":"Wave1")")));
  EXPECT_EQ(table.getWaveform("wave1").allocatedLength, 100u);
  table.removeWaveform("other");
  table.removeWaveform("WAVE1");
  EXPECT_THAT(failureOf([&] { table.getWaveform("wave1"); }),
              AllOf(HasSubstr("-1074101603"), HasSubstr(R"("kUsageTypeWaveformName","value":"wave1")")));
}

TEST(WaveformTable, MakesUpNamesAndCountsIds) {
  const std::string prefix = "cef2f2637054ceca09186954adb08ad";
  WaveformTable<WaveformEntry> table;
  EXPECT_EQ(table.addWaveform("", 1).name, prefix + "0");
  table.addWaveform(prefix + "2", 1);
  const WaveformEntry& moved = table.addWaveform("", 1);
  EXPECT_EQ(moved.name, prefix + "3");
  EXPECT_EQ(moved.id, 2u);
  EXPECT_THROW(table.addWaveform(prefix + "2", 1), kterr::Exception) << "counts for nothing";
  for (const char* suffix : {"0", "2"}) table.removeWaveform(prefix + suffix);
  EXPECT_EQ(table.addWaveform("", 1).name, prefix + "4") << "no number below the count, free as it is";
  EXPECT_EQ(table.findWaveformById(3)->first, prefix + "4");
  EXPECT_THAT(failureOf([&] { table.findWaveformById(0); }),
              AllOf(HasSubstr("-1074101603"), Not(HasSubstr("translator"))));
  table.removeAllWaveforms();
  EXPECT_EQ(table.addWaveform("b", 1).id, 0u);
}

TEST(ScopeExitCleanupOperation, DropsWhatItsCallThrows) {
  const auto throwing = [] { throw std::bad_alloc(); };
  EXPECT_NO_THROW(ScopeExitCleanupOperation<decltype(throwing)>{throwing});
}

}  // namespace
}  // namespace ktorba
