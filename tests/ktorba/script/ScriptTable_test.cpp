#include "ktorba/script/ScriptTable.h"

#include <gmock/gmock.h>

#include "testing/caught.h"

namespace ktorba {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::StartsWith;

std::shared_ptr<ScriptEntry> loadedEntry() {
  auto entry = std::make_shared<ScriptEntry>();
  entry->isLoaded = true;
  return entry;
}

TEST(ScriptTable, ReplacesScriptsUnderTheirFirstName) {
  ScriptTable table;
  const auto first = loadedEntry();
  const auto second = loadedEntry();
  table.addScript("main", first);
  table.addScript("Main", second);
  EXPECT_FALSE(first->isLoaded || second->isLoaded);
  EXPECT_EQ(table.getScript("MAIN"), second);
  EXPECT_THAT(table.getScriptNames(), ElementsAre("main"));
  EXPECT_EQ(table.getScriptCount(), 1u);
}

TEST(ScriptTable, ForgetsTheActiveNameWithItsScript) {
  ScriptTable table;
  table.setActiveScript("Unknown");
  EXPECT_EQ(table.getActiveScript(), "Unknown");
  table.addScript("b", loadedEntry());
  table.addScript("A", loadedEntry());
  EXPECT_THAT(table.getScriptNames(), ElementsAre("A", "b"));
  table.setActiveScript("a");
  table.deleteScript("b");
  EXPECT_EQ(table.getActiveScript(), "a");
  table.deleteScript("A");
  EXPECT_EQ(table.getActiveScript(), "");
  table.setActiveScript("c");
  table.deleteAllScripts();
  EXPECT_EQ(table.getActiveScript(), "");
}

TEST(ScriptTable, NamesTheScriptItDoesNotHold) {
  ScriptTable table;
  for (const auto& call : std::initializer_list<std::function<void()>>{[&] { table.deleteScript("Main"); },
                                                                       [&] { table.getScript("Main"); }}) {
    EXPECT_THAT(failureOf(call), AllOf(StartsWith("-1074097987"),
                                       HasSubstr(R"("kUsageTypeScriptName","value":"Main","value_type":"string")"),
                                       HasSubstr(R"("file":"ktorba\\script\\ScriptTable")")));
  }
}

}  // namespace
}  // namespace ktorba
