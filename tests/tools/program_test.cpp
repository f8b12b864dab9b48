// Where scripts have errors and what is surely not meant; what is said of them stands in sessions/.
#include <gmock/gmock.h>

#include "tools/check/checkText.h"
#include "tools/check/warnings.h"
#include "tools/program/ProgramBuilder.h"
#include "tools/text/Refusal.h"
#include "tools/text/characters.h"

namespace tools {
namespace {

TEST(ProgramBuilder, RefusesWhatIsNoNameOrIsTaken) {
  ProgramBuilder bench({});
  bench.addWaveform("a", 64);
  for (const char* name : {"A", "_e", "f g"}) EXPECT_THROW(bench.addWaveform(name, 64), Refusal) << name;
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
}  // namespace tools
