#include "ktisl/ErrorStore.h"

#include <gtest/gtest.h>

#include <string>
#include <thread>

namespace {

using atat::ErrorStore;

// A record that frees its text.
struct Status : tStatus {
  explicit Status(std::int32_t newCode, const char* text = nullptr) : tStatus(kterr::makeStatus()) {
    code = newCode;
    if (text != nullptr) kterr::setJson(*this, text);
  }
  ~Status() { kterr::freeJson(*this); }
};

TEST(ErrorStore, MergesByPriorityInBothDirections) {
  constexpr struct {
    std::int32_t held, given;
    bool taken;
  } kCases[] = {{0, 5, true}, {0, 0, false}, {5, -7, true}, {5, 6, false}, {-7, -9, false}, {-7, 5, false}};
  for (const auto& [held, given, taken] : kCases) {
    SCOPED_TRACE(std::to_string(held) + " " + std::to_string(given));
    Status heldStatus(held, R"({"a":"held"})");
    const Status givenStatus(given, R"({"a":"given"})");
    ErrorStore into;
    ErrorStore from;
    into.mergeFrom(heldStatus);
    from.mergeFrom(givenStatus);

    EXPECT_EQ(into.mergeFrom(givenStatus), taken);
    EXPECT_EQ(from.copyTo(heldStatus), taken);

    EXPECT_EQ(into.getElaboration(), taken ? R"({"a":"given"})" : held == 0 ? "" : R"({"a":"held"})");
    EXPECT_EQ(heldStatus.code, taken ? given : held);
    EXPECT_STREQ(heldStatus.json, taken ? R"({"a":"given"})" : R"({"a":"held"})");
  }
}

TEST(ErrorStore, CopiesAsMuchOfTheElaborationAsFits) {
  ErrorStore store;
  char buffer[] = "****";
  EXPECT_EQ(store.copyElaboration(buffer, sizeof buffer), 0u);
  store.mergeFrom(Status(-7, R"({"a":1})"));
  store.clear();
  constexpr struct {
    std::size_t size;
    const char* text;
  } kCases[] = {{4, "{}"}, {3, "{}"}, {2, "{"}, {1, ""}, {0, "****"}};
  for (const auto& [size, text] : kCases) {
    std::string destination = "****";
    EXPECT_EQ(store.copyElaboration(destination.data(), size), 3u);
    EXPECT_STREQ(destination.c_str(), text) << size;
    EXPECT_EQ(destination.back(), '*');
  }
  EXPECT_EQ(store.copyElaboration(nullptr, 4), 3u);
  EXPECT_TRUE(store.mergeFrom(Status(5))) << "a cleared store holds no code";
}

TEST(ErrorStore, KeepsThreadsApart) {
  ErrorStore store;
  const auto work = [&store] {
    for (int i = 0; i < 1000; ++i) {
      store.mergeFrom(Status(-i, R"({"a":"text"})"));
      Status copy(0);
      store.copyTo(copy);
      const std::string text = store.getElaboration();
      ASSERT_TRUE(text.empty() || text == "{}" || text == R"({"a":"text"})");
      store.clear();
    }
  };
  std::jthread other(work);
  work();
}

}  // namespace
