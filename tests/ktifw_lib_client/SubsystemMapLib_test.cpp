#include "ktifw_lib_client/SubsystemMapLib.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "ktifw_lib_client/ContextLib.h"
#include "testing/FrameworkDouble.h"
#include "testing/caught.h"
#include "testing/heap.h"

namespace {

using ktifw_lib_client::SubsystemMapLib;
using testing::ElementsAre;
using Numbers = std::vector<std::uint32_t>;

class SubsystemMap : public testing::Test {
 protected:
  SubsystemMap() { framework = {}; }

  FrameworkDouble& framework = frameworkDouble();
};

TEST_F(SubsystemMap, MapsTheTreeDepthFirst) {
  framework.isRecording = true;
  framework.children = [](std::uint32_t context) {
    const std::map<std::uint32_t, Numbers> tree{{0, {3, 7}}, {3, {4}}};
    return tree.contains(context) ? tree.at(context) : Numbers{};
  };
  SubsystemMapLib map(1);
  EXPECT_THAT(framework.take(), ElementsAre("GetAllChildren 1 0 0", "GetAllChildren 1 0 2", "GetAllChildren 1 3 0",
                                            "GetAllChildren 1 3 1", "GetAllChildren 1 4 0", "GetAllChildren 1 7 0"));
  ktifw::Status status = kterr::makeLocatedStatus();
  for (const std::uint32_t number : {0u, 3u, 4u, 7u}) EXPECT_NE(map.getContext(number, status), nullptr);
  EXPECT_EQ(map.getContext(5, status), nullptr);
  EXPECT_EQ(status.code, -52005);
  EXPECT_STREQ(status.file, R"(ktifw_lib_client\SubsystemMapLib)");
  status = kterr::makeLocatedStatus();
  EXPECT_EQ(map.getContextUnsupported(3, status), nullptr);
  EXPECT_EQ(status.code, -52002);
}

// The children of context 7, as a context of the map lists them.
class Children : public SubsystemMap {
 protected:
  Children() {
    framework.children = [](std::uint32_t context) { return Numbers(context == 0 ? 1 : 0, 9); };
    map.emplace(1);
  }

  std::size_t count() {
    std::vector<ktifw::ContextInterface*> children;
    ktifw_lib_client::ContextLib(1, 7, *map).getAllChildren(children, status);
    return children.size();
  }

  std::optional<SubsystemMapLib> map;
  ktifw::Status status = kterr::makeLocatedStatus();
};

TEST_F(Children, SurviveAFrameworkThatChangesItsMind) {
  // The counts that are named by call after call, the last for ever, and how many are taken.
  const std::pair<std::vector<std::size_t>, std::size_t> kCases[] = {
      {{3, 1}, 1}, {{1, 3}, 3}, {{2, 0}, 0}, {{1, 2, 3, 4, 5, 6, 7, 8}, 8}, {{65537, 65537, 5}, 65536}};
  for (const auto& [counts, taken] : kCases) {
    std::size_t call = 0;
    framework.children = [&, &counts = counts](std::uint32_t) {
      return Numbers(counts[std::min(call++, counts.size() - 1)], 9);
    };
    EXPECT_EQ(count(), taken);
    EXPECT_EQ(status.code, 0);
  }
}

TEST_F(Children, AreNoneAfterAFailure) {
  const std::pair<std::int32_t, std::function<void(tStatus&)>> kFailures[] = {
      {-9, [](tStatus& given) { given.code = -9; }},
      {-52000, [](tStatus&) { heap::isRefusing = true; }},
      {-52005, nullptr}};  // the map knows no context 1000
  framework.children = [](std::uint32_t) { return Numbers{1000, 9}; };
  for (const auto& [code, report] : kFailures) {
    status = kterr::makeLocatedStatus();
    framework.report = report;
    EXPECT_EQ(count(), 0u);
    heap::isRefusing = false;
    EXPECT_EQ(status.code, code);
  }
}

TEST_F(SubsystemMap, TakesDeepAndWideTrees) {
  constexpr std::uint32_t kContexts = 100'000;
  const auto chain = [](std::uint32_t context) { return Numbers(context < kContexts ? 1 : 0, context + 1); };
  const auto fan = [](std::uint32_t context) {
    Numbers children(context == 0 ? kContexts : 0);
    for (std::uint32_t& child : children) child = ++context;
    return children;
  };
  for (const decltype(FrameworkDouble::children)& children : {decltype(FrameworkDouble::children)(chain), {fan}}) {
    framework.children = children;
    ktifw::Status status = kterr::makeLocatedStatus();
    EXPECT_NE(SubsystemMapLib(1).getContext(kContexts, status), nullptr);
  }
}

TEST_F(SubsystemMap, PassesOverContextsListedAgain) {
  framework.children = [](std::uint32_t context) { return Numbers{(context + 1) % 3, 2, 2}; };
  SubsystemMapLib map(1);
  EXPECT_EQ(framework.callCount, 6u) << "each of 0, 1, 2 is asked once, in two calls";
  ktifw::Status status = kterr::makeLocatedStatus();
  for (const std::uint32_t number : {0u, 1u, 2u}) EXPECT_NE(map.getContext(number, status), nullptr);
}

TEST_F(SubsystemMap, RaisesFrameworkErrorsAndListsThatAreNotGiven) {
  const auto raised = [] { return failureOf([] { SubsystemMapLib(1); }); };
  framework.children = [](std::uint32_t) { return Numbers{}; };
  framework.report = [](tStatus& given) { given.code = -9, kterr::setJson(given, R"({"file":"a","line":3})"); };
  EXPECT_EQ(raised(), R"(-9{"file":"a","line":3})");
  framework.report = nullptr;
  framework.announced = 1u << 28;
  framework.isRecording = true;
  EXPECT_THAT(raised(), testing::MatchesRegex("-52003.*ContextNumbers.*"));
  EXPECT_THAT(framework.take(), ElementsAre("GetAllChildren 1 0 0", "GetAllChildren 1 0 65536")) << "reserved in steps";
}

}  // namespace
