#include "ktifw_lib_client/ContextLib.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "ktifw_lib_client/SubsystemMapLib.h"
#include "ktifw_lib_client/countedMemory.h"
#include "platform/KtifwuDouble.h"

namespace {

using Numbers = std::vector<std::uint32_t>;
using testing::ElementsAre;

// A root with the child 7, which has the children 9 and 8.
KtifwuDouble& growTree() {
  ktifwuDouble().report = nullptr;
  ktifwuDouble().children = [](std::uint32_t number) {
    return number == 0 ? Numbers{7} : number == 7 ? Numbers{9, 8} : Numbers{};
  };
  return ktifwuDouble();
}

class ContextLib : public testing::Test {
 protected:
  ContextLib() { framework.take(); }
  ~ContextLib() override { growTree().take(); }

  void useAll() {
    read = context.contextualize(5, status);
    write = context.contextualizeWrite(6, 99, status);
    info = context.getInfo(status);
    context.getSubsystemAndOffset(subsystem, offset, status);
    context.checkVersion(4, 2, false, &first, &second, status);
    context.checkVersion(4, 3, true, nullptr, nullptr, status);
    child = context.getChild(101, 1, status);
    context.getChildrenByUid(3, children, status);
    context.getAllChildren(children, status);
  }

  KtifwuDouble& framework = growTree();
  ktifw_lib_client::SubsystemMapLib map{1};
  ktifw_lib_client::ContextLib context{1, 7, map};
  ktifw::Status status = kterr::makeLocatedStatus();
  ktifw::ReadInstruction read;
  ktifw::WriteInstruction write;
  ktifw::ContextInfo info;
  std::uint8_t subsystem = 0;
  std::uint64_t offset = 0;
  bool first = false;
  bool second = true;
  ktifw::ContextInterface* child = nullptr;
  std::vector<ktifw::ContextInterface*> children;
};

TEST_F(ContextLib, PassesQuestionsAndAnswersThrough) {
  useAll();
  EXPECT_THAT(
      framework.take(),
      ElementsAre("Contextualize 1 7 5", "Contextualize 1 7 6", "GetInfo 1 7", "GetSubsystemAndOffset 1 7",
                  "CheckVersion 1 7 4 2 0", "CheckVersion 1 7 4 3 1", "GetChild 1 101 1 7", "GetChildrenByUid 1 7 3 0",
                  "GetChildrenByUid 1 7 3 2", "GetAllChildren 1 7 0", "GetAllChildren 1 7 2"));
  EXPECT_TRUE(read.subsystem == 1 && read.offset == 2);
  EXPECT_TRUE(write.subsystem == 1 && write.offset == 2 && write.value == 99);
  EXPECT_THAT(info.values, ElementsAre(1, 2, 3, 4));
  EXPECT_TRUE(subsystem == 1 && offset == 2);
  EXPECT_TRUE(first && !second);
  EXPECT_EQ(child, map.getContext(8, status));
  auto* const nine = map.getContext(9, status);
  EXPECT_THAT(children, ElementsAre(nine, child, nine, child));
  EXPECT_EQ(status.code, 0);
}

TEST_F(ContextLib, AsksUnderAnErrorOnlyWhatAlwaysAsks) {
  status.code = -7;
  std::vector<std::int32_t> codes;
  framework.report = [&](tStatus& given) { codes.push_back(given.code); };
  useAll();
  EXPECT_THAT(framework.take(), ElementsAre("Contextualize 1 7 5", "Contextualize 1 7 6", "CheckVersion 1 7 4 2 0",
                                            "CheckVersion 1 7 4 3 1"));
  EXPECT_THAT(codes, testing::Each(-7));
  EXPECT_TRUE(!first && second) << "results written under an error";
  EXPECT_TRUE(child == nullptr && children.empty());
}

TEST_F(ContextLib, SurvivesAFrameworkThatChangesItsMind) {
  const struct {
    std::vector<std::size_t> counts;  // named by call after call, the last for ever
    std::size_t taken;
  } kCases[] = {{{3, 1}, 1}, {{1, 3}, 3}, {{2, 0}, 0}, {{1, 2, 3, 4, 5, 6, 7, 8}, 4}};
  for (const auto& [counts, taken] : kCases) {
    std::size_t call = 0;
    framework.children = [&](std::uint32_t) { return Numbers(counts[std::min(call++, counts.size() - 1)], 9); };
    children.clear();
    context.getAllChildren(children, status);
    EXPECT_EQ(children.size(), taken);
    EXPECT_EQ(status.code, 0);
  }
}

TEST_F(ContextLib, ReportsFailuresWithoutAChild) {
  const std::pair<std::int32_t, std::function<void(tStatus&)>> kFailures[] = {
      {-9, [](tStatus& given) { given.code = -9; }},
      {-52000, [](tStatus&) { refuseMemory = true; }},
      {-52005, nullptr}};
  framework.children = [](std::uint32_t) { return Numbers{1000, 9}; };
  for (const auto& [code, report] : kFailures) {
    status = kterr::makeLocatedStatus();
    framework.report = report;
    context.getAllChildren(children, status);
    refuseMemory = false;
    EXPECT_EQ(status.code, code);
    EXPECT_TRUE(children.empty());
  }
  status = kterr::makeLocatedStatus();
  framework.report = kFailures[0].second;
  EXPECT_EQ(context.getChild(101, 1, status), nullptr);
  EXPECT_EQ(status.code, -9);
}

}  // namespace
