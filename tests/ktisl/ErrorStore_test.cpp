#include "ktisl/ErrorStore.h"

#include <gtest/gtest.h>

#include <boost/intrusive_ptr.hpp>
#include <thread>

#include "ktisl/Session.h"
#include "testing/Record.h"

namespace {

using atat::ErrorStore;

struct Status : Record {
  Status(std::int32_t newCode, const char* text) : Record(text) { code = newCode; }
};

TEST(ErrorStore, KeepsACopyOfTheFirstErrorAndGivesItOn) {
  ErrorStore store;
  const Status first(-7, R"({"a":"first"})");
  EXPECT_TRUE(store.mergeFrom(first));
  EXPECT_FALSE(store.mergeFrom(Status(-9, R"({"a":"second"})")));
  EXPECT_EQ(store.getElaboration(), R"({"a":"first"})");
  EXPECT_STREQ(first.json, R"({"a":"first"})");
  Status warning(5, "{}");
  EXPECT_TRUE(store.copyTo(warning));
  EXPECT_EQ(warning.code, -7);
  EXPECT_STREQ(warning.json, R"({"a":"first"})");
  EXPECT_FALSE(store.copyTo(warning));
}

TEST(ErrorStore, CopiesAsMuchOfTheElaborationAsFits) {
  ErrorStore store;
  EXPECT_EQ(store.copyElaboration(nullptr, 4), 0u);
  store.mergeFrom(Status(-7, R"({"a":1})"));
  store.clear();
  for (const auto& [size, text] : {std::pair{4u, "{}"}, {3u, "{}"}, {2u, "{"}, {1u, ""}, {0u, "****"}}) {
    std::string destination = "****";
    EXPECT_EQ(store.copyElaboration(destination.data(), size), 3u);
    EXPECT_STREQ(destination.c_str(), text) << size;
  }
  EXPECT_EQ(store.copyElaboration(nullptr, 4), 3u);
  EXPECT_TRUE(store.mergeFrom(Status(5, "{}"))) << "a cleared store holds no code";
}

struct CountedSession : ktisl::Session {
  explicit CountedSession(std::atomic<int>& destroyed) : Session("3, 0"), destroyed_(destroyed) {}
  ~CountedSession() override { ++destroyed_; }
  std::atomic<int>& destroyed_;
};

TEST(Session, KeepsThreadsApartAndLivesUntilTheLastLetsGo) {
  std::atomic<int> destroyed = 0;
  boost::intrusive_ptr<CountedSession> session(new CountedSession(destroyed));
  EXPECT_STREQ(session->getName(), "3, 0");
  {
    const auto work = [session = std::move(session)] {
      for (int i = 0; i < 1000; ++i) {
        const boost::intrusive_ptr<CountedSession> reference = session;
        reference->errors().mergeFrom(Status(-i, R"({"a":"text"})"));
        const std::string text = reference->errors().getElaboration();
        ASSERT_TRUE(text.empty() || text == "{}" || text == R"({"a":"text"})") << text;
        reference->errors().clear();
      }
    };
    std::jthread first(work);
    std::jthread second(work);
  }
  EXPECT_EQ(destroyed, 1);
}

}  // namespace
