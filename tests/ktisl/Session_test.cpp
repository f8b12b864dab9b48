#include "ktisl/Session.h"

#include <gtest/gtest.h>

#include <boost/intrusive_ptr.hpp>
#include <thread>

namespace {

struct CountedSession : ktisl::Session {
  explicit CountedSession(std::atomic<int>& destroyed) : Session("3, 0"), destroyed_(destroyed) {}
  ~CountedSession() override { ++destroyed_; }
  std::atomic<int>& destroyed_;
};

TEST(Session, LivesUntilTheLastOfManyThreadsLetsGo) {
  std::atomic<int> destroyed = 0;
  boost::intrusive_ptr<CountedSession> session(new CountedSession(destroyed));
  EXPECT_STREQ(session->getName(), "3, 0");
  EXPECT_EQ(&session->processErrors(), &atat::processErrorStore());
  {
    const auto borrow = [session] {
      for (int i = 0; i < 1000; ++i) boost::intrusive_ptr<CountedSession> reference = session;
    };
    std::jthread first(borrow);
    std::jthread second(borrow);
    session.reset();
  }
  EXPECT_EQ(destroyed, 1);
}

}  // namespace
