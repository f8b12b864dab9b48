#include "ktorba/script/ScriptTable.h"

#include <gmock/gmock.h>

#include "testing/caught.h"

namespace ktorba {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::StartsWith;

TEST(ScriptTable, ReplacesScriptsUnderTheirFirstName) {
  ScriptTable table;
  const auto first = std::make_shared<ScriptEntry>(), second = std::make_shared<ScriptEntry>();
  first->isLoaded = second->isLoaded = true;
  table.addScript("main", first);
  table.addScript("Main", second);
  EXPECT_FALSE(first->isLoaded || second->isLoaded);
  EXPECT_EQ(table.getScript("MAIN"), second);
  table.addScript("A", first);
  EXPECT_THAT(table.getScriptNames(), ElementsAre("A", "main"));
  EXPECT_EQ(table.getScriptCount(), 2u);
}

TEST(ScriptTable, ForgetsTheActiveNameWithItsScript) {
  ScriptTable table;
  table.setActiveScript("Unknown");
  EXPECT_EQ(table.getActiveScript(), "Unknown");
  for (const char* name : {"b", "A"}) table.addScript(name, std::make_shared<ScriptEntry>());
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
