// Where scripts have errors and what is surely not meant; what is said of them stands in sessions/.
#include <gmock/gmock.h>

#include "cli/UserError.h"
#include "cli/characters.h"
#include "cli/program/Workbench.h"
#include "cli/program/faultyScripts.h"
#include "cli/program/warnings.h"

namespace cli {
namespace {

TEST(Workbench, RefusesWhatIsNoNameOrIsTaken) {
  Workbench bench({});
  bench.addWaveform("a", 64);
  for (const char* name : {"A", "_e", "f g"}) EXPECT_THROW(bench.addWaveform(name, 64), UserError) << name;
}

TEST(Utf8, OnlyValidSequencesAreCharacters) {
  for (const char* valid : {"", "a\u00e9\u4e2d\U0001F600", "\U0010FFFF"}) {
    EXPECT_EQ(findInvalidUtf8(valid), std::nullopt) << valid;
  }
  for (const char* invalid : {"\xC0\x80", "\xE0\x80\x80", "\xED\xA0\x80", "\xF4\x90\x80\x80", "\xE4\xB8", "\x80"}) {
    EXPECT_EQ(findInvalidUtf8(invalid), 0u) << invalid;
  }
  EXPECT_EQ(findInvalidUtf8("ab\xFF"), 2u);
  EXPECT_EQ(toValidUtf8("a\xE4z"), "a\uFFFDz");
}

}  // namespace
}  // namespace cli
